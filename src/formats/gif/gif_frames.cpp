#include "formats/gif/gif_frames.h"

#include <cstring>

#include "core/limits.h"
#include "formats/gif/gif.h"
#include "platform/file_view.h"

namespace fotomill {

using namespace gif;

namespace {

// Calls `visit(r, y, count)` for every row of the frame, r in the frame and y on the screen, with
// `count` pixels on the screen.
template <typename Visit>
void ForVisibleRows(const GifFrame& frame, const Canvas& canvas, Visit visit) {
  const int32_t count = std::min(frame.width, canvas.image.Width() - frame.left);
  for (int32_t r = 0; r < frame.height && count > 0; ++r) {
    if (frame.top + r < canvas.image.Height()) visit(r, frame.top + r, static_cast<size_t>(count));
  }
}

// The position in the data of each row of a frame.
std::vector<int32_t> RowOrder(const GifFrame& frame) {
  std::vector<int32_t> order(static_cast<size_t>(frame.height));
  for (int32_t r = 0; r < frame.height; ++r) {
    order[static_cast<size_t>(frame.interlaced ? InterlacedRow(r, frame.height) : r)] = r;
  }
  return order;
}

void DrawRow(const uint8_t* indices, size_t count, int32_t transparent, const Palette& palette,
             uint8_t* color, uint8_t* alpha) {
  for (size_t x = 0; x < count; ++x, color += 3) {
    if (indices[x] == transparent) continue;
    const uint8_t* entry = &palette[size_t{3} * indices[x]];
    color[0] = entry[2];
    color[1] = entry[1];
    color[2] = entry[0];
    alpha[x] = 255;
  }
}

uint8_t* ColorsAt(Canvas& canvas, int32_t x, int32_t y) {
  return canvas.image.Row(y).data() + 3 * static_cast<size_t>(x);
}
uint8_t* AlphaAt(Canvas& canvas, int32_t x, int32_t y) { return canvas.alpha.Row(y).data() + x; }

class GifAnimation final : public Animation {
 public:
  Status Open(const std::string& fileName) {
    if (!file_.Open(fileName)) return Status::FileOpenError;
    ByteReader bytes(file_.Bytes());
    RETURN_IF_BAD(ParseScreen(bytes, screen_));
    start_ = bytes.Position();
    GifFrame frame;
    GifRemarks remarks;
    Status status = NextFrame(bytes, screen_, frame, &remarks);
    for (; status == Status::Ok && delays_.size() < limits.animationFrames;
         status = NextFrame(bytes, screen_, frame, &remarks)) {
      delays_.push_back(frame.delay * 10);
      SkipFrame(bytes);
    }
    if (delays_.empty()) return status;
    rounds_ = !remarks.loops ? 1 : remarks.repeats == 0 ? 0 : remarks.repeats + 1;
    return CheckPackedSize(screen_.width, screen_.height, 24);
  }

 private:
  Status Compose(size_t index) override {
    if (index == 0) {
      bytes_ = ByteReader(file_.Bytes());
      bytes_.Seek(start_);
      RETURN_IF_BAD(drawing_.Begin(screen_, canvas_));
    }
    GifFrame frame;
    RETURN_IF_BAD(NextFrame(bytes_, screen_, frame));
    RETURN_IF_BAD(drawing_.Draw(bytes_, frame, canvas_));
    return file_.Intact() ? Status::Ok : Status::FileReadError;
  }

  platform::FileView file_;
  ByteReader bytes_{{}};
  uint64_t start_ = 0;  // of the blocks
  GifScreen screen_;
  GifDrawing drawing_;
};

}  // namespace

Status GifDrawing::Begin(const GifScreen& screen, Canvas& canvas) {
  last_ = {};
  return NewCanvas(screen.width, screen.height, canvas);
}

Status GifDrawing::Draw(ByteReader& bytes, const GifFrame& frame, Canvas& canvas, int32_t* rows) {
  if (frame.width < 1 || frame.height < 1) return Status::DamagedFile;
  Dispose(canvas);
  if (frame.disposal == kToPrevious) RETURN_IF_BAD(KeepBeneath(frame, canvas));
  platform::MemoryBlock pixels;
  uint64_t done = 0;
  const Status status = DecodeFrame(bytes, frame, pixels, rows != nullptr ? &done : nullptr);
  if (rows != nullptr) *rows = static_cast<int32_t>(done / static_cast<uint64_t>(frame.width));
  if (status != Status::Ok && (rows == nullptr || *rows < 1)) return status;
  Palette palette;
  TakeColors(frame, palette);
  const std::vector<int32_t> order = RowOrder(frame);
  ForVisibleRows(frame, canvas, [&](int32_t r, int32_t y, size_t count) {
    const auto row = static_cast<uint64_t>(order[static_cast<size_t>(r)]);
    DrawRow(pixels.Data() + row * static_cast<uint64_t>(frame.width), count, frame.transparent,
            palette, ColorsAt(canvas, frame.left, y), AlphaAt(canvas, frame.left, y));
  });
  last_ = frame;
  return status;
}

// Saves the area below a frame, row by row: colors, then alpha.
Status GifDrawing::KeepBeneath(const GifFrame& frame, const Canvas& canvas) {
  uint64_t size = 0;
  ForVisibleRows(frame, canvas, [&](int32_t, int32_t, size_t count) { size += 4 * count; });
  if (size > 0 && !beneath_.Allocate(size, platform::Fill::Unset))
    return Status::MemoryAllocationError;
  uint8_t* kept = beneath_.Data();
  ForVisibleRows(frame, canvas, [&](int32_t, int32_t y, size_t count) {
    const auto left = static_cast<size_t>(frame.left);
    std::memcpy(kept, canvas.image.Row(y).data() + 3 * left, 3 * count);
    std::memcpy(kept + 3 * count, canvas.alpha.Row(y).data() + left, count);
    kept += 4 * count;
  });
  return Status::Ok;
}

void GifDrawing::Dispose(Canvas& canvas) {
  const uint8_t* kept = beneath_.Data();
  ForVisibleRows(last_, canvas, [&](int32_t, int32_t y, size_t count) {
    uint8_t* colors = ColorsAt(canvas, last_.left, y);
    uint8_t* alpha = AlphaAt(canvas, last_.left, y);
    if (last_.disposal == kToBackground) {
      std::memset(colors, 0, 3 * count);
      std::memset(alpha, 0, count);
    } else if (last_.disposal == kToPrevious) {
      std::memcpy(colors, kept, 3 * count);
      std::memcpy(alpha, kept + 3 * count, count);
      kept += 4 * count;
    }
  });
}

int32_t CountGifFrames(ByteReader bytes, GifScreen screen) {
  uint32_t count = 1;
  GifFrame frame;
  for (SkipFrame(bytes);
       count < limits.animationFrames && NextFrame(bytes, screen, frame) == Status::Ok; ++count)
    SkipFrame(bytes);
  return static_cast<int32_t>(count);
}

Status GifAnimate(const ReadRequest& request, AnimationPointer& animation) {
  auto opened = std::make_unique<GifAnimation>();
  RETURN_IF_BAD(opened->Open(request.fileName));
  animation = std::move(opened);
  return Status::Ok;
}

}  // namespace fotomill
