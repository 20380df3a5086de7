#pragma once

#include <wx/timer.h>

#include <atomic>
#include <functional>
#include <memory>
#include <string>

#include "desktop/windows/view/animation_bar.h"
#include "desktop/windows/view/view_canvas.h"

namespace fotomill::desktop {

class AnimationPlayer;

// The animation in a view window: its frames come onto the canvas at their time, with the bar below
// it.
class ViewAnimation {
 public:
  // What its window does for it.
  struct Events {
    // another frame is on the canvas, or the animation plays or pauses
    std::function<void()> changed;
    // a frame prepared for display; null if it cannot be
    std::function<ViewPicturePointer(const ViewPicturePointer&)> dressed;
  };

  // Canvas and bar must outlive it.
  ViewAnimation(ViewCanvas& canvas, AnimationBar& bar, Events events);
  ~ViewAnimation();
  ViewAnimation(const ViewAnimation&) = delete;
  ViewAnimation& operator=(const ViewAnimation&) = delete;

  // Begins with a picture that has come onto the canvas, if it is an animation; it plays at once
  // unless the system's animations are off. The bar comes and goes with it.
  void Begin(const ViewPicturePointer& picture);
  // Another picture is awaited.
  void End();
  bool Active() const { return player_ != nullptr; }  // there is an animation on the canvas
  bool Playing() const;                               // false where there is none, or it is paused
  // In full screen there is the picture alone.
  void HideBar(bool hide);
  void Toggle();  // plays or pauses
  void Step(int frames);  // pauses, and moves by that number of frames
  void Resized();         // frames are to fit another size
  // Frames are to be shown in another way.
  void ShowAgain();
  // "frame 3 of 12" with what else there is to tell; empty where no animation is.
  std::string StatusText() const;
  // Whether it plays, and has not been shown from beginning to end yet.
  bool MustFinish() const;

 private:
  void PlaceBar();
  void Tick();

  ViewCanvas& canvas_;
  AnimationBar& bar_;
  const Events events_;
  wxTimer timer_;
  bool hasBar_ = false;  // the picture that came last is an animation
  bool hideBar_ = false;
  std::unique_ptr<AnimationPlayer> player_;
  ViewPicturePointer shown_;                  // the player's frame, null before the first one
  // whether the player's thread may still tell something
  std::shared_ptr<std::atomic<bool>> alive_;
};

}  // namespace fotomill::desktop
