#pragma once

#include <wx/timer.h>
#include <wx/window.h>

#include <functional>
#include <optional>

#include "desktop/models/view/slideshow.h"

namespace fotomill::desktop {

// The slideshow of a view window: when the next picture comes, and which.
class ViewSlideshow {
 public:
  // What it asks and tells its window.
  struct Events {
    std::function<bool()> busy;              // the picture is not to go yet
    std::function<void(size_t place)> show;  // a place of the list
  };

  explicit ViewSlideshow(Events events);

  // Begins at `place` of a list of `count`, as was chosen last. ShownAt is to follow when that
  // picture is on the screen.
  void Start(size_t place, size_t count);
  void Stop();  // the picture shown stays
  bool Running() const {
    return order_.has_value();
  }  // between Start and Stop, or the last picture
  // This place is on the screen, from now on for its seconds.
  void ShownAt(size_t place, size_t count);
  // The position to decode ahead in addition to the neighbors.
  std::optional<size_t> Upcoming() const { return Running() ? order_->Upcoming() : std::nullopt; }
  // Asks for other choices and keeps them for the next time. False when that was cancelled.
  bool Choose(wxWindow& parent);

 private:
  void TimeIsUp();

  const Events events_;
  SlideshowChoices choices_;
  std::optional<SlideshowChoices> unkept_;  // that could not be written
  std::optional<Slideshow> order_;
  wxTimer timer_;
  size_t place_ = 0, count_ = 0;
};

}  // namespace fotomill::desktop
