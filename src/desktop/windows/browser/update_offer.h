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

// A browser's offer to make the missing thumbnail files of its folder: the bar above the list, and
// what continues behind it.
class UpdateOffer {
 public:
  // What the browser has to follow.
  struct Events {
    std::function<void()> answered;  // the bar was closed
    std::function<void()> made;      // there are new thumbnails
  };
  UpdateOffer(wxWindow* parent, Events events);
  ~UpdateOffer();

  // The bar, hidden while there is nothing to ask or tell; its parent lays it out.
  UpdateBar* Bar() const { return bar_; }
  // Offers once for a folder with these files; one without any is only cleaned up.
  void Offer(const std::string& folder, std::vector<std::string> files, const BrowserModes& modes);
  // The browser goes to another folder.
  void Forget();
  // Whether this browser asks; kept with its tab.
  bool Asks() const { return asks_; }
  void SetAsks(bool asks) { asks_ = asks; }

 private:
  void ShowBar(bool show);

  const Events events_;
  UpdateBar* bar_;
  std::shared_ptr<ThumbnailOffer> offer_;  // of this folder
  bool offered_ = false;
  bool asks_ = true;  // until the user wants no more offers here
};

}  // namespace fotomill::desktop
