#include "desktop/windows/browser/update_offer.h"

#include <wx/app.h>

#include "desktop/models/shell/event_log.h"
#include "desktop/windows/browser/update_bar.h"
#include "desktop/windows/widgets/wx_text.h"
#include "settings/job_options.h"

namespace fotomill::desktop {

UpdateOffer::UpdateOffer(wxWindow* parent, Events events) : events_(std::move(events)) {
  bar_ = new UpdateBar(parent, [this](int32_t choice) {
    if (offer_ != nullptr) offer_->Answer(choice);
    if (choice == kUpdateNever) asks_ = true;  // should offers be switched on again
    ShowBar(false);
    events_.answered();
  });
  bar_->Hide();
}

UpdateOffer::~UpdateOffer() {
  if (offer_ != nullptr) offer_->Stop();
}

void UpdateOffer::Offer(const std::string& folder, std::vector<std::string> files,
                        const BrowserModes& modes) {
  const ThumbnailUpdateOptions options = ThumbnailUpdateOptionsFromSettings();
  if (!options.offers) asks_ = true;
  if (offered_) return;
  offered_ = !files.empty();
  ThumbnailBrowser browser;
  browser.folder = folder;
  browser.files = std::move(files);
  browser.mode = static_cast<choice::ThumbnailMode>(modes.thumbnails);
  browser.view = static_cast<choice::ViewMode>(modes.view);
  browser.asks = asks_;
  browser.options = options;
  // Drops reports about a folder that was left meanwhile.
  const auto weak = std::make_shared<std::weak_ptr<ThumbnailOffer>>();
  const auto post = [weak](std::function<void()> action) {
    wxTheApp->CallAfter([weak, action = std::move(action)] {
      if (weak->lock() != nullptr) action();
    });
  };
  ThumbnailOffer::Events events;
  events.ask = [this, post](int32_t count, int32_t selected) {
    post([this, count, selected] {
      asks_ = false;  // one question is enough, whatever the answer
      bar_->Ask(count, selected);
      ShowBar(true);
      LogEvent("offer", std::to_string(count));
    });
  };
  events.scanning = [this, post](const std::string& text, size_t done, size_t total) {
    post([this, text, done, total] {
      bar_->Report(Label("%1: %2 of %3", Shown(text), done, total));
      ShowBar(true);
      LogEvent("scanning", text);
    });
  };
  events.keep = [](const ThumbnailUpdateOptions& chosen) {  // whatever the browser shows now
    wxTheApp->CallAfter([chosen] { StoreThumbnailUpdate(chosen); });
  };
  events.building = [this, post](size_t done, size_t total) {
    post([this, done, total] {
      bar_->Report(Label("Creating thumbnails: %1 of %2", done, total));
      ShowBar(done < total);
    });
  };
  events.ended = [this, post](bool changed) {
    post([this, changed] {
      ShowBar(false);
      if (changed) events_.made();
      LogEvent("offer-ended", changed ? "changed" : "unchanged");
    });
  };
  offer_ = ThumbnailOffer::Start(std::move(browser), std::move(events));
  *weak = offer_;
}

void UpdateOffer::Forget() {
  if (offer_ != nullptr) offer_->Stop();
  offer_.reset();
  offered_ = false;
  ShowBar(false);
}

void UpdateOffer::ShowBar(bool show) {
  if (bar_->IsShown() == show) return;
  bar_->Show(show);
  bar_->GetParent()->Layout();
}

}  // namespace fotomill::desktop
