#pragma once

#include <wx/timer.h>
#include <wx/window.h>

#include <functional>
#include <optional>

#include "desktop/models/view/slideshow.h"

namespace fotomill::desktop {

// The slideshow of a view window: timing and order.
class ViewSlideshow {
 public:
  // Callbacks to the window.
  struct Events {
    std::function<bool()> busy;              // do not leave the picture yet
    std::function<void(size_t place)> show;  // index in the list
  };

  explicit ViewSlideshow(Events events);

  // Starts at `place` in a list of `count`, with the last settings. Call ShownAt when that picture
  // is on the screen.
  void Start(size_t place, size_t count);
  void Stop();  // keeps the current picture
  bool Running() const {
    return order_.has_value();
  }  // from Start until Stop or the last picture
  // This place is now on the screen; starts its time.
  void ShownAt(size_t place, size_t count);
  // Call when the list has changed, but not the picture shown.
  void ListChanged(size_t place, size_t count) { place_ = place, count_ = count; }
  // The place to decode ahead in addition to the neighbors.
  std::optional<size_t> Upcoming() const { return Running() ? order_->Upcoming() : std::nullopt; }
  // Asks for settings and saves them. False if canceled.
  bool Choose(wxWindow& parent);

 private:
  void TimeIsUp();

  const Events events_;
  SlideshowChoices choices_;
  std::optional<SlideshowChoices> unkept_;  // could not be written
  std::optional<Slideshow> order_;
  wxTimer timer_;
  size_t place_ = 0, count_ = 0;
};

}  // namespace fotomill::desktop
