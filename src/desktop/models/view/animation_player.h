#pragma once

#include <cstdint>
#include <functional>

#include "desktop/models/view/animation_frames.h"

namespace fotomill::desktop {

// Plays an animation. Times are in seconds of the caller's clock; every frame is shown, so playing
// slows down if decoding takes too long. Not thread-safe.
class AnimationPlayer {
 public:
  // `wake` as for AnimationFrames: call At again.
  AnimationPlayer(ViewRequest request, uint64_t capacity, std::function<void()> wake)
      : frames_(std::move(request), capacity, std::move(wake)) {}

  // Continues from the current frame; after the last loop, from the first one.
  void Play();
  // Stays at the current frame.
  void Pause();
  bool Playing() const { return playing_; }  // from Play until Pause or the end of the last loop
  // Pauses and steps forward or back, wrapping around.
  void Step(int32_t frames);
  // The size that frames are decoded for, in pixels.
  void Fit(int32_t width, int32_t height) { frames_.Fit(width, height); }

  // The frame to show at this time; null if not
  // decoded yet. If called early, the current one.
  ViewPicturePointer At(double now);
  // Seconds until the next frame; negative if At does not advance by itself: paused, at the end, or
  // waiting for a frame.
  double SecondsLeft(double now) const;

  // The current frame, from 0; the number of frames known so far; why decoding ended, Ok if it has
  // not failed.
  size_t Frame() const { return frame_; }
  size_t Count() const { return frames_.Count(); }
  Status Failure() const { return frames_.Failure(); }
  // Whether all frames were shown for their duration, or can never be.
  bool PlayedOnce() const { return playedOnce_ || (Failure() != Status::Ok && Count() == 0); }

 private:
  static constexpr double kNotBegun = -1;

  void MoveOn(double now);
  bool AtTheEnd() const { return frame_ + 1 >= Count(); }
  bool IsLast() const;
  bool HasEnded() const { return frames_.Rounds() > 0 && round_ >= frames_.Rounds(); }
  double Delay() const { return frames_.DelayMs(frame_) / 1000.0; }

  AnimationFrames frames_;
  size_t frame_ = 0;
  int32_t round_ = 0;       // completed loops
  double due_ = kNotBegun;  // time of the next frame
  bool playing_ = false;
  bool playedOnce_ = false;
};

}  // namespace fotomill::desktop
