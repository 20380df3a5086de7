#pragma once

#include <cstdint>
#include <functional>

#include "desktop/models/view/animation_frames.h"

namespace fotomill::desktop {

// Plays an animation. Times are seconds of a clock that its holder keeps; every frame is shown, so
// that an animation that cannot be decoded in time goes slower. Used by one thread.
class AnimationPlayer {
 public:
  // `wake` as of AnimationFrames: At is to be asked again.
  AnimationPlayer(ViewRequest request, uint64_t capacity, std::function<void()> wake)
      : frames_(std::move(request), capacity, std::move(wake)) {}

  // Goes on from the frame that is shown; once the last round has ended, from the first one.
  void Play();
  // Stays at the current frame.
  void Pause();
  bool Playing() const { return playing_; }  // between Play and Pause, or the end of the last round
  // Pauses and goes that many frames on, or back; beyond the last one comes the first one.
  void Step(int32_t frames);
  // The size that frames are decoded for, in pixels.
  void Fit(int32_t width, int32_t height) { frames_.Fit(width, height); }

  // The frame to show at this time; null while it is not decoded yet. Asked too early it is the
  // frame shown already.
  ViewPicturePointer At(double now);
  // Seconds until At moves on; negative when it never does by itself: paused, at the end, or
  // waiting for a frame.
  double SecondsLeft(double now) const;

  // The frame that is shown, from 0, of how many are known so far; why decoding ended, Ok while it
  // has not failed.
  size_t Frame() const { return frame_; }
  size_t Count() const { return frames_.Count(); }
  Status Failure() const { return frames_.Failure(); }
  // Whether all frames were shown for their time, or never will be.
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
  int32_t round_ = 0;       // complete ones
  double due_ = kNotBegun;  // when the next frame is to come
  bool playing_ = false;
  bool playedOnce_ = false;
};

}  // namespace fotomill::desktop
