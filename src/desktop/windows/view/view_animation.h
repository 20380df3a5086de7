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

// Plays the animation in a view window: shows frames on the canvas at their times, with the bar
// below.
class ViewAnimation {
 public:
  // Callbacks to the window.
  struct Events {
    // another frame is shown, or the animation was started or paused
    std::function<void()> changed;
    // returns a frame prepared for display; null on failure
    std::function<ViewPicturePointer(const ViewPicturePointer&)> dressed;
  };

  // `canvas` and `bar` must outlive this object.
  ViewAnimation(ViewCanvas& canvas, AnimationBar& bar, Events events);
  ~ViewAnimation();
  ViewAnimation(const ViewAnimation&) = delete;
  ViewAnimation& operator=(const ViewAnimation&) = delete;

  // Call when a picture is shown: if it is an animation, plays it, unless animations are disabled
  // in the system, and shows the bar.
  void Begin(const ViewPicturePointer& picture);
  // Call when another picture is requested.
  void End();
  bool Active() const { return player_ != nullptr; }  // an animation is shown
  bool Playing() const;                               // false if paused, or not an animation
  // Hides the bar in full screen.
  void HideBar(bool hide);
  void Toggle();  // plays or pauses
  void Step(int frames);  // pauses and steps by that many frames
  void Resized();         // decodes frames for the new size
  // Call after display settings have changed.
  void ShowAgain();
  // "frame 3 of 12", with further information; empty if there is no animation.
  std::string StatusText() const;
  // Whether it is playing and has not been shown completely yet.
  bool MustFinish() const;

 private:
  void PlaceBar();
  void Tick();

  ViewCanvas& canvas_;
  AnimationBar& bar_;
  const Events events_;
  wxTimer timer_;
  bool hasBar_ = false;  // the last picture is an animation
  bool hideBar_ = false;
  std::unique_ptr<AnimationPlayer> player_;
  ViewPicturePointer shown_;  // the player's current frame, null before the first one
  // false: ignore further callbacks of the player's thread
  std::shared_ptr<std::atomic<bool>> alive_;
};

}  // namespace fotomill::desktop
