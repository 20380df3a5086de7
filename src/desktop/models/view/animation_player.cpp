#include "desktop/models/view/animation_player.h"

namespace fotomill::desktop {

void AnimationPlayer::Play() {
  if (playing_) return;
  if (HasEnded()) {
    round_ = 0;
    frame_ = 0;
  }
  playing_ = true;
  due_ = kNotBegun;
}

void AnimationPlayer::Pause() { playing_ = false; }

void AnimationPlayer::Step(int32_t frames) {
  playing_ = false;
  if (HasEnded()) round_ = 0;
  const auto count = static_cast<int64_t>(Count());
  if (count > 0)
    frame_ = static_cast<size_t>(((static_cast<int64_t>(frame_) + frames) % count + count) % count);
}

ViewPicturePointer AnimationPlayer::At(double now) {
  // fewer than the file claims
  if (const size_t count = Count(); count > 0 && frame_ >= count) frame_ = count - 1;
  if (playing_ && due_ != kNotBegun && now >= due_) MoveOn(now);
  frames_.Want(frame_);
  ViewPicturePointer picture = frames_.Find(frame_);
  if (playing_ && due_ == kNotBegun && picture != nullptr) due_ = now + Delay();
  return picture;
}

// Moves to the next frame, if it is decoded. A frame more than its duration late is still shown in
// full.
void AnimationPlayer::MoveOn(double now) {
  if (AtTheEnd()) playedOnce_ = true;
  if (IsLast()) {
    ++round_;
    playing_ = false;
    return;
  }
  const size_t next = AtTheEnd() ? 0 : frame_ + 1;
  if (frames_.Find(next) == nullptr) return;
  if (next == 0) ++round_;
  frame_ = next;
  due_ = due_ + Delay() > now ? due_ + Delay() : now + Delay();
}

// Whether the current frame is the last one to be shown.
bool AnimationPlayer::IsLast() const {
  return AtTheEnd() && (Count() == 1 || (frames_.Rounds() > 0 && round_ + 1 >= frames_.Rounds()));
}

double AnimationPlayer::SecondsLeft(double now) const {
  if (!playing_ || due_ == kNotBegun) return -1;
  if (!IsLast() && frames_.Find(AtTheEnd() ? 0 : frame_ + 1) == nullptr) return -1;
  return due_ > now ? due_ - now : 0;
}

}  // namespace fotomill::desktop
