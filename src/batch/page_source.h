#pragma once

#include <cstddef>
#include <cstdint>

#include "picture/animation.h"
#include "picture/picture_record.h"
#include "picture/read_request.h"

namespace fotomill {

// The pictures of a file one after the other: its pages, or the frames of an animation as they are
// seen. One is held at a time, beside what an animation needs.
class PageSource {
 public:
  // Opens the file. Statuses of reading.
  Status Open(const ReadRequest& request);
  // The next picture, with the file's metadata, and how long a frame of it is shown. NoImages (20)
  // behind the last one; else statuses of reading.
  Status Next(PicturePointer& picture, int32_t& delayMs);

  size_t Count() const { return count_; }                  // of pictures, at least 1
  bool Animated() const { return animation_ != nullptr; }  // they are frames
  int32_t Rounds() const { return animation_ == nullptr ? 0 : animation_->Rounds(); }

 private:
  Status NextFrame(PictureRecord& picture, int32_t& delayMs);

  ReadRequest request_;
  PicturePointer facts_;
  AnimationPointer animation_;  // of files with frames
  size_t count_ = 0, next_ = 0;
};

}  // namespace fotomill
