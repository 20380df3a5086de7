#pragma once

#include <cstdint>
#include <memory>
#include <vector>

#include "core/status.h"
#include "picture/packed_image.h"

namespace fotomill {

// The surface that frames are composed on: 24 bits, and an alpha plane of the same size.
struct Canvas {
  PackedImage image, alpha;
};
// A fully transparent canvas. Statuses as NewPackedImage.
Status NewCanvas(int32_t width, int32_t height, Canvas& canvas);

// The composed frames of a file, in order. Each frame is decoded only once, whatever its
// position in the file, and only one is kept in memory. Codecs derive from this; the file stays
// open for its lifetime.
class Animation {
 public:
  virtual ~Animation() = default;

  // The duration of each frame, in milliseconds as stored in the file; its size is the number of
  // frames, at least one.
  const std::vector<int32_t>& Delays() const { return delays_; }
  // Number of times the animation plays, 0 for endless.
  int32_t Rounds() const { return rounds_; }

  // Composes the next frame, initially the first. NoImages (20) after the last; on any other
  // failure, which is the codec's own, no more frames are available until Rewind.
  Status Next();
  // Goes back to before the first frame.
  void Rewind();
  // The frame that Next composed; valid until it is called again.
  const Canvas& Frame() const { return canvas_; }

 protected:
  // Updates `canvas_` from the previous frame to this one; creates it for the first frame.
  virtual Status Compose(size_t frame) = 0;

  std::vector<int32_t> delays_;
  int32_t rounds_ = 1;
  Canvas canvas_;

 private:
  size_t next_ = 0;
  Status failure_ = Status::Ok;  // of the last Next
};
using AnimationPointer = std::unique_ptr<Animation>;  // null if there is none

// The duration a frame with delay `delayMs` is shown. Delays of 10 ms or less mean 100 ms: old
// programs wrote such delays knowing that no browser of their time would honor them, and browsers
// have kept that behavior since. Source: E. Lawrence, "Trivia: Animated GIF Timing", IEInternals
// (2010, for Internet Explorer 10 revised in 2012).
constexpr int32_t ShownDelayMs(int32_t delayMs) { return delayMs <= 10 ? 100 : delayMs; }

}  // namespace fotomill
