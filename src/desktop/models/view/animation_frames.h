#pragma once

#include <condition_variable>
#include <cstdint>
#include <functional>
#include <mutex>
#include <thread>
#include <vector>

#include "core/status.h"
#include "desktop/models/view/view_picture.h"
#include "picture/animation.h"

namespace fotomill::desktop {

// Decodes the frames of an animation on a thread of its own. All of them are kept when they fit into a number of bytes; else
// as many around the one that is shown as do, and they are decoded again in each round.
class AnimationFrames {
 public:
  // `wake` is called on the thread whenever the file was opened, a frame came or one could not be decoded.
  AnimationFrames(ViewWish wish, uint64_t capacity, std::function<void()> wake);
  ~AnimationFrames();
  AnimationFrames(const AnimationFrames&) = delete;
  AnimationFrames& operator=(const AnimationFrames&) = delete;

  // How many frames there are, 0 until the file was opened. Less than the file says when one of them cannot be decoded.
  size_t Count() const;
  // Why there are no frames, or none behind the last one; Ok otherwise.
  Status Failure() const;
  int32_t DelayMs(size_t frame) const;  // that it is shown; 0 for one that is not there
  int32_t Rounds() const;               // 0 for ever

  // This frame is on the screen and those behind it are wanted next. At first that is the first one.
  void Want(size_t frame);
  // A frame if it is decoded, fitted to whatever window.
  ViewPicturePointer Find(size_t frame) const;
  // From here on frames are made for a window of this size; those that stay in memory are made again.
  void Fit(int32_t width, int32_t height);

 private:
  void Work();
  Status Open(PicturePointer& facts, AnimationPointer& animation);
  bool NextFrame(size_t& frame) const;
  bool Keeps(size_t frame) const;
  bool IsFitted(size_t frame) const;
  ViewPicturePointer Decode(size_t frame, const PictureRecord& facts, Animation& animation, size_t& position);
  void Take(size_t frame, ViewPicturePointer picture);
  size_t Room() const;

  const uint64_t capacity_;
  const std::function<void()> wake_;
  mutable std::mutex mutex_;
  std::condition_variable wanted_;
  ViewWish wish_;
  std::vector<int32_t> delaysMs_;
  int32_t rounds_ = 1;
  Status failure_ = Status::Ok;
  std::vector<ViewPicturePointer> frames_;  // as many as delays; null where none is kept
  uint64_t frameBytes_ = 0;                 // of the largest so far
  size_t shown_ = 0;
  bool stop_ = false;
  std::thread worker_;
};

}  // namespace fotomill::desktop
