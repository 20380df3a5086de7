#pragma once

#include <cstdint>
#include <memory>
#include <vector>

#include "core/status.h"
#include "picture/packed_image.h"

namespace fotomill {

// What frames are drawn on: 24 bits, and an alpha plane of the same size.
struct Canvas {
  PackedImage image, alpha;
};
// A canvas that is transparent all over. Statuses as NewPackedImage.
Status NewCanvas(int32_t width, int32_t height, Canvas& canvas);

// The frames of a file one after the other, each as it is on the canvas after those before it.
// A frame costs its own decoding, wherever in the file it is, and only one is held. Codecs derive
// from this; the file stays open as long.
class Animation {
 public:
  virtual ~Animation() = default;

  // How long each frame is shown, in milliseconds as the file has it, and so how many there are: at
  // least one.
  const std::vector<int32_t>& Delays() const { return delays_; }
  // How often the frames are to be played, 0 for ever.
  int32_t Rounds() const { return rounds_; }

  // Composes the next frame, at first the first one. NoImages (20) behind the last; any other
  // failure is the codec's own, and no frame can be had from there on until Rewind.
  Status Next();
  // Goes back to before the first frame.
  void Rewind();
  // The frame that Next composed; good until it is called again.
  const Canvas& Frame() const { return canvas_; }

 protected:
  // Brings `canvas_` from the frame before to this one; for the first one it is made.
  virtual Status Compose(size_t frame) = 0;

  std::vector<int32_t> delays_;
  int32_t rounds_ = 1;
  Canvas canvas_;

 private:
  size_t next_ = 0;
  Status failure_ = Status::Ok;  // of the last Next
};
using AnimationPointer = std::unique_ptr<Animation>;  // null if there is none

// How long a frame is shown that asks for `delayMs`. One of 10 ms or less stands for 100 ms: old
// programs wrote such delays knowing that no browser of their time would keep to them, and browsers
// have done so ever since. Source: E. Lawrence, "Trivia: Animated GIF Timing", IEInternals (2010,
// for Internet Explorer 10 revised in 2012).
constexpr int32_t ShownDelayMs(int32_t delayMs) { return delayMs <= 10 ? 100 : delayMs; }

}  // namespace fotomill
