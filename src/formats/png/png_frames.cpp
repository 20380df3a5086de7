// Frames of an animated PNG. Each is passed to the decoder as a separate file: a header with the
// frame's size, the palette and other chunks that precede the pixels, and the frame's data.
//
//   acTL  frames, plays (4 bytes each, 0: endless)
//   fcTL  sequence number, width, height, x, y (4 bytes each), delay as a fraction of a second
//         (2 bytes each, denominator 0 means 100), disposal (0 keep, 1 clear, 2 restore previous),
//         blending (0 replace, 1 over)
//   fdAT  sequence number (4 bytes), then data as in IDAT
//
// Pixels before the first fcTL belong to no frame.
// Source: W3C, "Portable Network Graphics (PNG) Specification (Third Edition)", 2025,
// section 11.3.6.
#include <libdeflate.h>

#include <algorithm>
#include <cstring>
#include <memory>
#include <span>
#include <string>
#include <utility>
#include <vector>

#include "containers/png_chunks.h"
#include "core/byte_reader.h"
#include "core/limits.h"
#include "formats/png/png.h"
#include "picture/animation.h"
#include "platform/file_view.h"
#include "processing/promote.h"

namespace fotomill {

namespace {

constexpr uint8_t kClear = 1, kAsBefore = 2;
constexpr size_t kMostHead = 768;                         // of one chunk: 256 colors
constexpr size_t kSequenceBytes = 4, kSizePlace = 8 + 8;  // of width and height in a file

struct PngFrame {
  int32_t width = 0, height = 0, left = 0, top = 0;
  int32_t delayMs = 0;
  uint8_t disposal = 0;
  bool over = false;
  std::vector<std::span<const uint8_t>> data = {};  // as in IDAT
};

uint32_t CrcOf(std::span<const uint8_t> typeAndData) {
  return libdeflate_crc32(0, typeAndData.data(), typeAndData.size());
}

void AppendChunk(std::vector<uint8_t>& file, std::string_view type, std::span<const uint8_t> data) {
  const auto put = [&](uint64_t value) {
    for (int shift = 24; shift >= 0; shift -= 8)
      file.push_back(static_cast<uint8_t>(value >> shift));
  };
  put(data.size());
  const size_t start = file.size();
  file.insert(file.end(), type.begin(), type.end());
  file.insert(file.end(), data.begin(), data.end());
  put(CrcOf(std::span(file).subspan(start)));
}

bool ReadControl(std::span<const uint8_t> data, int32_t width, int32_t height, PngFrame& frame) {
  ByteReader bytes(data);
  bytes.Skip(kSequenceBytes);
  const uint32_t w = bytes.Be32(), h = bytes.Be32(), x = bytes.Be32(), y = bytes.Be32();
  const uint32_t numerator = bytes.Be16(), denominator = bytes.Be16();
  frame.disposal = bytes.U8();
  frame.over = bytes.U8() == 1;
  frame.delayMs = static_cast<int32_t>(1000 * numerator / (denominator == 0 ? 100 : denominator));
  const bool inside = w > 0 && h > 0 && uint64_t{x} + w <= static_cast<uint64_t>(width) &&
                      uint64_t{y} + h <= static_cast<uint64_t>(height);
  frame.width = static_cast<int32_t>(w);
  frame.height = static_cast<int32_t>(h);
  frame.left = static_cast<int32_t>(x);
  frame.top = static_cast<int32_t>(y);
  return bytes.Ok() && inside;
}

class PngAnimation final : public Animation {
 public:
  Status Open(const ReadRequest& request) {
    if (!file_.Open(request.fileName)) return Status::FileOpenError;
    options_ = request.options;
    stop_ = request.stop;
    PictureRecord facts;
    RETURN_IF_BAD(DescribePng(file_.Bytes(), options_, facts));
    width_ = facts.width;
    height_ = facts.height;
    RETURN_IF_BAD(CheckFileMemory(3 * PackedRowBytes(width_, height_, 24)));
    Collect(static_cast<size_t>(facts.pageCount), request.partial);
    for (const PngFrame& frame : frames_) delays_.push_back(frame.delayMs);
    return CheckPackedSize(width_, height_, 24);
  }

 private:
  // Collects the chunks before the pixels, and the frames; without frames, the still picture is the
  // only one. If the file is truncated, one frame without data stands for the missing ones.
  void Collect(size_t frames, bool partial) {
    PngChunks chunks(file_.Bytes());
    PngFrame still{.width = width_, .height = height_};
    bool open = false;  // data belong to the last frame
    bool ended = false;
    uint32_t claimed = 0;
    for (PngChunk chunk; chunks.Next(chunk);) {
      ended = chunk.type == "IEND";
      if (chunk.type == "acTL") {
        ByteReader bytes(chunk.data);
        claimed = bytes.Be32();
        plays_ = static_cast<int32_t>(std::min<uint32_t>(bytes.Be32(), INT32_MAX));
      } else if (chunk.type == "fcTL") {
        PngFrame frame;
        open = frames_.size() < frames && ReadControl(chunk.data, width_, height_, frame);
        if (open) frames_.push_back(std::move(frame));
      } else if (chunk.type == "IDAT") {
        if (open) frames_.back().data.push_back(chunk.data);
        still.data.push_back(chunk.data);
      } else if (chunk.type == "fdAT" && chunk.data.size() >= kSequenceBytes) {
        if (open) frames_.back().data.push_back(chunk.data.subspan(kSequenceBytes));
      } else if (frames_.empty() || frames_[0].data.empty()) {
        KeepHead(chunk);
      }
    }
    std::erase_if(frames_, [](const PngFrame& frame) { return frame.data.empty(); });
    const bool cut = !ended && !partial && frames_.size() < claimed;
    if (frames == 1 || frames_.empty()) {
      frames_.assign(1, std::move(still));
    } else if (cut) {
      frames_.emplace_back();
    }
    rounds_ = plays_;
  }

  // Keeps other chunks the decoder needs; profiles and texts belong to the file.
  void KeepHead(const PngChunk& chunk) {
    constexpr std::string_view kTypes[] = {"IHDR", "PLTE", "tRNS"};
    const auto* const type = std::ranges::find(kTypes, chunk.type);
    if (type == std::end(kTypes) || chunk.data.size() > kMostHead) return;
    bool& kept = kept_[static_cast<size_t>(type - std::begin(kTypes))];
    if (!kept) AppendChunk(head_, chunk.type, chunk.data);
    kept = true;
  }

  Status Compose(size_t index) override {
    if (index == 0) RETURN_IF_BAD(NewCanvas(width_, height_, canvas_));
    if (index > 0) Dispose(frames_[index - 1]);
    const PngFrame& frame = frames_[index];
    if (index > 0 && frame.data.empty()) return Status::FileReadError;
    PictureRecord picture;
    picture.stop = stop_;
    RETURN_IF_BAD(DecodePng(FileOf(frame), options_, picture));
    RETURN_IF_BAD(PromoteToAlpha(picture));
    // the first frame has nothing to restore
    if (frame.disposal == kAsBefore && index > 0) RETURN_IF_BAD(KeepBeneath(frame));
    for (int32_t y = 0; y < frame.height; ++y) DrawRow(frame, picture, y);
    return file_.Intact() ? Status::Ok : Status::FileReadError;
  }

  std::vector<uint8_t> FileOf(const PngFrame& frame) const {
    std::vector<uint8_t> file(kPngSignature.begin(), kPngSignature.end());
    file.insert(file.end(), head_.begin(), head_.end());
    const auto put = [&](size_t at, int32_t value) {
      for (size_t i = 0; i < 4; ++i)
        file[at + i] = static_cast<uint8_t>(static_cast<uint32_t>(value) >> (24 - 8 * i));
    };
    put(kSizePlace, frame.width);
    put(kSizePlace + 4, frame.height);
    constexpr size_t kTypePlace = 8 + 4, kHeadBytes = 4 + 13;
    const uint32_t crc = CrcOf(std::span(file).subspan(kTypePlace, kHeadBytes));
    put(kTypePlace + kHeadBytes, static_cast<int32_t>(crc));
    for (const auto data : frame.data) AppendChunk(file, "IDAT", data);
    AppendChunk(file, "IEND", {});
    return file;
  }

  uint8_t* ColorsAt(const PngFrame& frame, int32_t y) {
    return canvas_.image.Row(frame.top + y).data() + 3 * int64_t{frame.left};
  }
  uint8_t* AlphaAt(const PngFrame& frame, int32_t y) {
    return canvas_.alpha.Row(frame.top + y).data() + frame.left;
  }

  void DrawRow(const PngFrame& frame, const PictureRecord& picture, int32_t y) {
    const uint8_t* colors = picture.image.Row(y).data();
    const uint8_t* alpha = picture.alpha.Row(y).data();
    uint8_t *target = ColorsAt(frame, y), *opacity = AlphaAt(frame, y);
    for (int32_t x = 0; x < frame.width; ++x, colors += 3, target += 3) {
      if (!frame.over || alpha[x] == 255 || opacity[x] == 0) {
        std::memcpy(target, colors, 3);
        opacity[x] = alpha[x];
      } else if (alpha[x] != 0) {
        Blend(colors, alpha[x], target, opacity[x]);
      }
    }
  }

  // Composites one pixel over another: section 13.16 of the specification.
  static void Blend(const uint8_t* color, uint32_t alpha, uint8_t* target, uint8_t& opacity) {
    const uint32_t beneath = opacity * (255 - alpha), whole = 255 * alpha + beneath;
    for (size_t i = 0; i < 3; ++i) {
      target[i] =
          static_cast<uint8_t>((255 * alpha * color[i] + beneath * target[i] + whole / 2) / whole);
    }
    opacity = static_cast<uint8_t>((whole + 127) / 255);
  }

  Status KeepBeneath(const PngFrame& frame) {
    const size_t row = 4 * static_cast<size_t>(frame.width);
    if (!beneath_.Allocate(row * static_cast<size_t>(frame.height), platform::Fill::Unset))
      return Status::MemoryAllocationError;
    for (int32_t y = 0; y < frame.height; ++y) {
      uint8_t* kept = beneath_.Data() + row * static_cast<size_t>(y);
      std::memcpy(kept, ColorsAt(frame, y), 3 * static_cast<size_t>(frame.width));
      std::memcpy(kept + 3 * static_cast<size_t>(frame.width), AlphaAt(frame, y),
                  static_cast<size_t>(frame.width));
    }
    return Status::Ok;
  }

  void Dispose(const PngFrame& frame) {
    const auto width = static_cast<size_t>(frame.width);
    const bool back = frame.disposal == kAsBefore && !beneath_.Empty();
    if (frame.disposal != kClear && frame.disposal != kAsBefore) return;
    for (int32_t y = 0; y < frame.height; ++y) {
      if (back) {
        const uint8_t* kept = beneath_.Data() + 4 * width * static_cast<size_t>(y);
        std::memcpy(ColorsAt(frame, y), kept, 3 * width);
        std::memcpy(AlphaAt(frame, y), kept + 3 * width, width);
      } else {
        std::memset(ColorsAt(frame, y), 0, 3 * width);
        std::memset(AlphaAt(frame, y), 0, width);
      }
    }
    beneath_.Free();
  }

  platform::FileView file_;
  ReadOptions options_;
  StopToken stop_;
  int32_t width_ = 0, height_ = 0;
  int32_t plays_ = 1;
  std::vector<uint8_t> head_;      // chunks before the pixels, the header first
  bool kept_[3] = {};              // which chunks were found; each is used once
  std::vector<PngFrame> frames_;   // views into the file
  platform::MemoryBlock beneath_;  // the area below the last frame, if it must be restored
};

}  // namespace

Status PngAnimate(const ReadRequest& request, AnimationPointer& animation) {
  auto opened = std::make_unique<PngAnimation>();
  RETURN_IF_BAD(opened->Open(request));
  animation = std::move(opened);
  return Status::Ok;
}

}  // namespace fotomill
