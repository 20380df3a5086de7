#pragma once

#include <wx/panel.h>

#include <functional>
#include <string>
#include <vector>

#include "desktop/models/browser/path_crumbs.h"
#include "desktop/windows/widgets/loose_work.h"

class wxButton;

namespace fotomill::desktop {

// The path of a folder: a button for each folder in it, each followed by a button that lists its
// subfolders.
class CrumbStrip : public wxPanel {
 public:
  // User actions.
  struct Events {
    std::function<void(const std::string& folder)> open;
    std::function<void()> edit;  // empty space was clicked
  };
  CrumbStrip(wxWindow* parent, Events events);

  // Creates the buttons for a folder; the first ones are left out if there is not enough room.
  void ShowFolder(const std::string& folder);

 private:
  struct Place {
    Crumb crumb;
    wxButton* button = nullptr;
    wxButton* below = nullptr;
  };
  void Build();
  void LayOut();
  void ListBelow(size_t place);
  void OfferBelow(size_t place, const std::vector<std::string>& names);
  void OfferHidden();
  void OpenLater(const std::string& folder);

  const Events events_;
  std::vector<Place> places_;
  wxButton* more_ = nullptr;  // for the folders left out
  size_t firstShown_ = 0;
  LooseWork listing_;
};

}  // namespace fotomill::desktop
