#pragma once

#include <cstdint>
#include <functional>
#include <mutex>
#include <vector>

#include "core/status.h"
#include "core/workers/latest_work.h"
#include "desktop/models/view/view_picture.h"
#include "picture/animation.h"

namespace fotomill::desktop {

// Decodes the frames of an animation apart. All of them are kept when they fit into a number of
// bytes; else as many around the one that is shown as do, and they are decoded again in each round.
class AnimationFrames {
 public:
  // `wake` is called on a thread of the pool whenever the file was opened, a frame came or one
  // could not be decoded.
  AnimationFrames(ViewRequest request, uint64_t capacity, std::function<void()> wake);
  ~AnimationFrames();
  AnimationFrames(const AnimationFrames&) = delete;
  AnimationFrames& operator=(const AnimationFrames&) = delete;

  // How many frames there are, 0 until the file was opened. Less than the file says when one of
  // them cannot be decoded.
  size_t Count() const;
  // Why there are no frames, or none behind the last one; Ok otherwise.
  Status Failure() const;
  int32_t DelayMs(size_t frame) const;  // that it is shown; 0 for one that is not there
  int32_t Rounds() const;               // 0 for ever

  // This frame is on the screen and those behind it are wanted next. At first that is the first
  // one.
  void Want(size_t frame);
  // A frame if it is decoded, fitted to whatever window.
  ViewPicturePointer Find(size_t frame) const;
  // From here on frames are made for a window of this size; those that stay in memory are made
  // again.
  void Fit(int32_t width, int32_t height);

 private:
  LatestWork::Piece Next();
  void Open();
  Status OpenFile();
  void MakeFrame(size_t frame);
  bool NextFrame(size_t& frame) const;
  bool Keeps(size_t frame) const;
  bool IsFitted(size_t frame) const;
  ViewPicturePointer Decode(size_t frame);
  void Keep(size_t frame, ViewPicturePointer picture);
  size_t Room() const;

  const uint64_t capacity_;
  const std::function<void()> wake_;
  mutable std::mutex mutex_;
  ViewRequest request_;
  std::vector<int32_t> delaysMs_;
  int32_t rounds_ = 1;
  Status failure_ = Status::Ok;
  std::vector<ViewPicturePointer> frames_;  // as many as delays; null where none is kept
  uint64_t frameBytes_ = 0;                 // of the largest so far
  size_t shown_ = 0;
  bool opened_ = false;                     // or tried to
  bool stop_ = false;
  // Of the piece of work that goes on.
  PicturePointer facts_;
  AnimationPointer animation_;
  size_t position_ = 0;  // the next frame of the animation
  LatestWork work_;      // last: it uses the rest
};

}  // namespace fotomill::desktop
