#include "picture/animation.h"

namespace fotomill {

Status NewCanvas(int32_t width, int32_t height, Canvas& canvas) {
  RETURN_IF_BAD(NewPackedImage(width, height, nullptr, 24, canvas.image));
  return NewAlphaPlane(width, height, canvas.alpha);
}

Status Animation::Next() {
  if (failure_ != Status::Ok) return failure_;
  failure_ = next_ < delays_.size() ? Compose(next_) : Status::NoImages;
  if (failure_ == Status::Ok) ++next_;
  return failure_;
}

void Animation::Rewind() {
  next_ = 0;
  failure_ = Status::Ok;
}

}  // namespace fotomill
