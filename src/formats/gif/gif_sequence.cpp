// GIF files with several frames. Each frame is the part of the screen that differs from the
// previous frame; within it, unchanged pixels become transparent if the palette has an entry left,
// which compresses well. If a pixel turns transparent, the previous frame must cover the whole
// screen and be cleared. Therefore a frame can only be written when the next one is known.
#include <algorithm>
#include <cstring>
#include <memory>
#include <utility>
#include <vector>

#include "core/byte_writer.h"
#include "formats/gif/gif.h"
#include "formats/gif/gif_blocks.h"
#include "formats/gif/gif_lzw.h"
#include "picture/animation.h"
#include "processing/changed_area.h"
#include "processing/promote.h"

namespace fotomill {

using namespace gif;

namespace {

constexpr int32_t kMostColors = 256;
constexpr uint8_t kOpaqueFrom = 128;  // half of full opacity

// Makes all pixels either transparent black or opaque.
void MakeSharp(Canvas& canvas) {
  for (int32_t y = 0; y < canvas.image.Height(); ++y) {
    uint8_t* colors = canvas.image.Row(y).data();
    uint8_t* alpha = canvas.alpha.Row(y).data();
    for (int32_t x = 0; x < canvas.image.Width(); ++x) {
      alpha[x] = alpha[x] < kOpaqueFrom ? 0 : 255;
      if (alpha[x] == 0) std::memset(colors + 3 * int64_t{x}, 0, 3);
    }
  }
}

// The colors of opaque pixels. False if there are too many for a palette, counting an entry for
// transparency if needed.
bool CollectColors(const Canvas& canvas, ColorSet& colors, bool& transparent) {
  std::vector<uint8_t> row;
  transparent = false;
  for (int32_t y = 0; y < canvas.image.Height(); ++y) {
    const uint8_t* source = canvas.image.Row(y).data();
    const uint8_t* alpha = canvas.alpha.Row(y).data();
    row.clear();
    for (int32_t x = 0; x < canvas.image.Width(); ++x) {
      transparent = transparent || alpha[x] == 0;
      if (alpha[x] != 0)
        row.insert(row.end(), source + 3 * int64_t{x}, source + 3 * int64_t{x} + 3);
    }
    if (!colors.AddRow(row.data(), static_cast<int32_t>(row.size() / 3))) return false;
  }
  return colors.Count() + (transparent ? 1 : 0) <= kMostColors;
}

bool AnyClears(const Canvas& before, const Canvas& after) {
  for (int32_t y = 0; y < after.alpha.Height(); ++y) {
    const auto a = before.alpha.Row(y), b = after.alpha.Row(y);
    for (size_t x = 0; x < static_cast<size_t>(after.alpha.Width()); ++x) {
      if (a[x] != 0 && b[x] == 0) return true;
    }
  }
  return false;
}

// A frame that is written when the next one is known.
struct PendingFrame {
  Canvas canvas;
  ColorSet colors;
  bool transparent = false;  // it has transparent pixels
  int32_t delay = 0;         // in hundredths of a second
};

class GifSequence final : public SequenceWriter {
 public:
  GifSequence(const SequenceFacts& facts, const WriteOptions& options)
      : facts_(facts), options_(options) {}
  Status Create(const std::string& path) {
    return out_.Create(path) ? Status::Ok : Status::ErrorCreatingFile;
  }

  Status Add(PictureRecord& picture, int32_t delayMs) override {
    auto frame = std::make_unique<PendingFrame>();
    frame->delay = std::clamp((delayMs + 5) / 10, 0, int32_t{UINT16_MAX});
    if (pending_ != nullptr && (picture.image.Width() != pending_->canvas.image.Width() ||
                                picture.image.Height() != pending_->canvas.image.Height())) {
      return Status::UnsuitableImage;
    }
    // three canvases: the screen, the pending frame and the new one; and an index for each pixel
    const uint64_t pixels = static_cast<uint64_t>(picture.image.Width()) *
                            static_cast<uint64_t>(picture.image.Height());
    RETURN_IF_BAD(CheckFileMemory(13 * pixels));
    RETURN_IF_BAD(PromoteToAlpha(picture));
    frame->canvas.image = std::move(picture.image);
    frame->canvas.alpha = std::move(picture.alpha);
    MakeSharp(frame->canvas);
    if (!CollectColors(frame->canvas, frame->colors, frame->transparent)) {
      picture.image = std::move(frame->canvas.image);
      picture.alpha = std::move(frame->canvas.alpha);
      return Status::TooManyColors;
    }
    if (pending_ == nullptr) {
      RETURN_IF_BAD(Begin(frame->canvas, picture));
    } else {
      RETURN_IF_BAD(WritePending(AnyClears(pending_->canvas, frame->canvas)));
    }
    pending_ = std::move(frame);
    return Status::Ok;
  }

  Status Finish() override {
    if (pending_ == nullptr) return Status::EmptyImage;
    RETURN_IF_BAD(WritePending(false));
    out_.U8(kEndBlock);
    return CommitOutput(out_, options_);
  }

 private:
  Status Begin(const Canvas& canvas, const PictureRecord& picture) {
    const int32_t width = canvas.image.Width(), height = canvas.image.Height();
    if (width > UINT16_MAX || height > UINT16_MAX) return Status::UnsuitableImage;
    out_.Text("GIF89a");
    out_.Le16(static_cast<uint16_t>(width));
    out_.Le16(static_cast<uint16_t>(height));
    out_.Zeros(3);  // no global palette
    if (facts_.animated && facts_.rounds != 1) WriteLoops();
    if (options_.KeepsMetadata()) WriteGifComment(out_, picture.comment);
    return NewCanvas(width, height, screen_);
  }

  // The number of repetitions; 0 for endless. Source: Netscape's application extension.
  void WriteLoops() {
    const int32_t again = facts_.rounds == 0 ? 0 : std::min<int32_t>(facts_.rounds - 1, UINT16_MAX);
    out_.U8(kExtensionBlock);
    out_.U8(kApplication);
    out_.U8(11);
    out_.Text("NETSCAPE2.0");
    out_.U8(3);
    out_.U8(1);
    out_.Le16(static_cast<uint16_t>(again));
    out_.U8(0);
  }

  // `clear`: the screen must be cleared before the next frame.
  Status WritePending(bool clear) {
    PendingFrame& frame = *pending_;
    const Rectangle area = clear || first_
                               ? Rectangle{0, 0, screen_.image.Width(), screen_.image.Height()}
                               : ChangedArea(screen_, frame.canvas);
    const int32_t used = frame.colors.Count();
    // unchanged pixels need no color if there is a free entry
    const bool skips = !first_ && used < kMostColors;
    const bool transparent = frame.transparent || skips;
    Palette palette{};
    frame.colors.Number(palette);
    int32_t bits = 1;
    while ((1 << bits) < used + (transparent ? 1 : 0)) ++bits;
    WriteControl(frame, clear, transparent ? used : kNoIndex);
    WriteHead(area, bits);
    out_.Bytes(std::span(palette).first(size_t{3} << bits));
    WriteIndices(frame, area, bits, skips);
    first_ = false;
    if (clear) {
      return NewCanvas(screen_.image.Width(), screen_.image.Height(), screen_);
    }
    screen_ = std::move(frame.canvas);
    return out_.Failed() ? Status::ErrorWritingFile : Status::Ok;
  }

  void WriteControl(const PendingFrame& frame, bool clear, int32_t transparent) {
    const int disposal = clear ? kToBackground : kKeep;
    out_.U8(kExtensionBlock);
    out_.U8(kGraphicControl);
    out_.U8(4);
    out_.U8(static_cast<uint8_t>(disposal << 2 | (transparent != kNoIndex ? 1 : 0)));
    out_.Le16(static_cast<uint16_t>(frame.delay));
    out_.U8(static_cast<uint8_t>(transparent == kNoIndex ? 0 : transparent));
    out_.U8(0);
  }

  void WriteHead(const Rectangle& area, int32_t bits) {
    out_.U8(kPictureBlock);
    for (const int32_t value : {area.x, area.y, area.width, area.height})
      out_.Le16(static_cast<uint16_t>(value));
    out_.U8(static_cast<uint8_t>(0x80 | (bits - 1)));
  }

  void WriteIndices(const PendingFrame& frame, const Rectangle& area, int32_t bits, bool skips) {
    GifPixelEncoder encoder(out_, bits);
    std::vector<uint8_t> indices(static_cast<size_t>(area.width));
    const auto none = static_cast<uint8_t>(frame.colors.Count());
    for (int32_t y = area.y; y < area.y + area.height && !out_.Failed(); ++y) {
      const uint8_t* colors = frame.canvas.image.Row(y).data() + 3 * int64_t{area.x};
      const uint8_t* alpha = frame.canvas.alpha.Row(y).data() + area.x;
      const uint8_t* old = screen_.image.Row(y).data() + 3 * int64_t{area.x};
      const uint8_t* oldAlpha = screen_.alpha.Row(y).data() + area.x;
      for (size_t x = 0; x < indices.size(); ++x) {
        const uint8_t* color = colors + 3 * x;
        const bool same =
            skips && oldAlpha[x] == alpha[x] && std::memcmp(color, old + 3 * x, 3) == 0;
        const uint32_t value = static_cast<uint32_t>(color[2] << 16 | color[1] << 8 | color[0]);
        indices[x] = alpha[x] == 0 || same ? none : frame.colors.IndexOf(value);
      }
      encoder.Add(indices);
    }
    encoder.Finish();
  }

  const SequenceFacts facts_;
  const WriteOptions options_;
  ByteWriter out_;
  Canvas screen_;  // after the frames written so far
  std::unique_ptr<PendingFrame> pending_;
  bool first_ = true;  // the screen is still empty
};

}  // namespace

Status GifSequenceBegin(const std::string& path, const SequenceFacts& facts,
                        const WriteOptions& options, SequencePointer& sequence) {
  auto made = std::make_unique<GifSequence>(facts, options);
  RETURN_IF_BAD(made->Create(path));
  sequence = std::move(made);
  return Status::Ok;
}

}  // namespace fotomill
