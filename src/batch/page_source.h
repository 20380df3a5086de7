#pragma once

#include <cstddef>
#include <cstdint>

#include "picture/animation.h"
#include "picture/picture_record.h"
#include "picture/read_request.h"

namespace fotomill {

// Reads the pictures of a file in sequence: its pages, or the composed frames of an animation.
// Keeps one at a time, plus what an animation needs.
class PageSource {
 public:
  // Opens the file. Statuses of reading.
  Status Open(const ReadRequest& request);
  // The next picture, with the file's metadata, and the duration of a frame. NoImages (20) after
  // the last one; else statuses of reading.
  Status Next(PicturePointer& picture, int32_t& delayMs);

  size_t Count() const { return count_; }                  // number of pictures, at least 1
  bool Animated() const { return animation_ != nullptr; }  // pictures are frames
  int32_t Rounds() const { return animation_ == nullptr ? 0 : animation_->Rounds(); }

 private:
  Status NextFrame(PictureRecord& picture, int32_t& delayMs);

  ReadRequest request_;
  PicturePointer facts_;
  AnimationPointer animation_;  // for files with frames
  size_t count_ = 0, next_ = 0;
};

}  // namespace fotomill
