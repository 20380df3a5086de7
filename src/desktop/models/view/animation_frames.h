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

// Decodes the frames of an animation in the background. Keeps all of them if they fit in `capacity`
// bytes; otherwise those around the current one, decoding them again in each loop.
class AnimationFrames {
 public:
  // `wake` is called on a pool thread when the file
  // was opened, or a frame was decoded or failed.
  AnimationFrames(ViewRequest request, uint64_t capacity, std::function<void()> wake);
  ~AnimationFrames();
  AnimationFrames(const AnimationFrames&) = delete;
  AnimationFrames& operator=(const AnimationFrames&) = delete;

  // Number of frames, 0 until the file is opened. Less than in the file if one of them cannot be
  // decoded.
  size_t Count() const;
  // Why there are no frames, or no more after the last one; Ok otherwise.
  Status Failure() const;
  int32_t DelayMs(size_t frame) const;  // duration of a frame; 0 if there is none
  int32_t Rounds() const;               // loop count, 0: endless

  // Sets the frame on the screen; the following
  // ones are decoded next. Initially the first one.
  void Want(size_t frame);
  // A frame if it is decoded, fitted to any window size.
  ViewPicturePointer Find(size_t frame) const;
  // From now on, makes frames for a window of
  // this size; those in memory are made again.
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
  std::vector<ViewPicturePointer> frames_;  // same size as delays; null if not kept
  uint64_t frameBytes_ = 0;                 // largest so far
  size_t shown_ = 0;
  bool opened_ = false;  // or failed to open
  bool stop_ = false;
  // For the current piece of work.
  PicturePointer facts_;
  AnimationPointer animation_;
  size_t position_ = 0;  // the animation's next frame
  LatestWork work_;      // must be last: it uses the other members
};

}  // namespace fotomill::desktop
