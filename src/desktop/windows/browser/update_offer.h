#pragma once

#include <functional>
#include <memory>
#include <string>
#include <vector>

#include "desktop/models/thumbnails/thumbnail_offer.h"
#include "settings/folder_override.h"

class wxWindow;

namespace fotomill::desktop {

class UpdateBar;

// A browser's offer to create the missing thumbnail files of its folder: the bar above the list,
// and the background work.
class UpdateOffer {
 public:
  // Notifications to the browser.
  struct Events {
    std::function<void()> answered;  // the bar was closed
    std::function<void()> made;      // new thumbnails were created
  };
  UpdateOffer(wxWindow* parent, Events events);
  ~UpdateOffer();

  // The bar, hidden if not needed; laid out by its parent.
  UpdateBar* Bar() const { return bar_; }
  // Offers once for a folder with these files; if empty, only cleans up.
  void Offer(const std::string& folder, std::vector<std::string> files, const BrowserModes& modes);
  // Call when the browser changes to another folder.
  void Forget();
  // Whether this browser asks; saved with its tab.
  bool Asks() const { return asks_; }
  void SetAsks(bool asks) { asks_ = asks; }

 private:
  void ShowBar(bool show);

  const Events events_;
  UpdateBar* bar_;
  std::shared_ptr<ThumbnailOffer> offer_;  // for this folder
  bool offered_ = false;
  bool asks_ = true;  // false once the question was shown
};

}  // namespace fotomill::desktop
