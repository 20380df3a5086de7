#include "desktop/windows/view/view_slideshow.h"

#include <wx/msgdlg.h>

#include <random>

#include "desktop/models/shell/event_log.h"
#include "desktop/windows/view/slideshow_dialog.h"
#include "desktop/windows/widgets/wx_text.h"

namespace fotomill::desktop {

namespace {

constexpr int kAskAgainMs = 50;

}  // namespace

ViewSlideshow::ViewSlideshow(Events events) : events_(std::move(events)) {
  timer_.Bind(wxEVT_TIMER, [this](wxTimerEvent&) { TimeIsUp(); });
}

void ViewSlideshow::Start(size_t place, size_t count) {
  choices_ = unkept_ ? *unkept_ : LoadSlideshowChoices();
  order_.emplace(choices_, count, place, std::random_device()());
  LogEvent("slideshow", "seconds=" + std::to_string(choices_.seconds) +
                            " random=" + (choices_.random ? "1" : "0") +
                            " repeat=" + (choices_.repeat ? "1" : "0"));
}

void ViewSlideshow::Stop() {
  timer_.Stop();
  order_.reset();
}

void ViewSlideshow::ShownAt(size_t place, size_t count) {
  if (!Running()) return;
  place_ = place;
  count_ = count;
  timer_.StartOnce(1000 * choices_.seconds);
}

void ViewSlideshow::TimeIsUp() {
  if (!Running()) return;
  if (events_.busy()) {
    timer_.StartOnce(kAskAgainMs);
    return;
  }
  const std::optional<size_t> next = order_->Next(place_, count_);
  if (!next) {
    Stop();
    LogEvent("slideshow", "ended");
  } else if (*next == place_) {
    ShownAt(place_, count_);
  } else {
    events_.show(*next);
  }
}

bool ViewSlideshow::Choose(wxWindow& parent) {
  const std::optional<SlideshowChoices> chosen = AskForSlideshow(parent, LoadSlideshowChoices());
  if (!chosen) return false;
  unkept_.reset();
  if (!SaveSlideshowChoices(*chosen)) {
    unkept_ = chosen;
    wxMessageBox(Label("The slideshow settings could not be saved."), Label("Slideshow"),
                 wxOK | wxICON_WARNING, &parent);
  }
  return true;
}

}  // namespace fotomill::desktop
