#pragma once

#include <wx/panel.h>

#include <functional>
#include <string>
#include <vector>

#include "desktop/models/browser/path_crumbs.h"
#include "desktop/windows/widgets/loose_work.h"

class wxButton;

namespace fotomill::desktop {

// The way to a folder: a button for each folder on it, and behind each a button that lists the
// folders in it.
class CrumbStrip : public wxPanel {
 public:
  // What the user did in it.
  struct Events {
    std::function<void(const std::string& folder)> open;
    std::function<void()> edit;  // empty space was clicked
  };
  CrumbStrip(wxWindow* parent, Events events);

  // Makes the buttons for a folder; those at the front that do not fit are left out.
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
  wxButton* more_ = nullptr;  // stands for the places that do not fit
  size_t firstShown_ = 0;
  LooseWork listing_;
};

}  // namespace fotomill::desktop
