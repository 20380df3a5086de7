#pragma once

#include <wx/panel.h>

#include <functional>
#include <string>
#include <vector>

#include "desktop/windows/widgets/loose_work.h"

class wxBitmapButton;
class wxBoxSizer;
class wxTextCtrl;

namespace fotomill::desktop {

class CrumbStrip;
class FolderTrail;

// Where a browser is, and the ways from there: back, forward, up, a folder on the way or below it,
// or one that is typed.
class PathBar : public wxPanel {
 public:
  // What the user did in it.
  struct Events {
    std::function<void(int steps)> step;  // back or ahead along the trail
    std::function<void()> up;
    std::function<void(const std::string& folder)> open;  // a folder that is there
    std::function<void()> left;                           // by Escape
  };
  // The trail is the browser's; it outlives the bar.
  PathBar(wxWindow* parent, const FolderTrail& trail, Events events);

  // The browser is there now: shows the way to it and which of the buttons lead on.
  void ShowFolder(const std::string& folder);
  // Lets the user type a folder in the place of the buttons.
  void Edit();
  // Offers the folders that the browser went through.
  void OfferTrail();

 private:
  void BuildEdit();
  void ShowEdit(bool show);
  void ReadNames();
  wxString Typed() const;
  void CompleteTyped();
  void ShowCompletion(int step);
  void OpenTyped();
  void OfferSteps(wxWindow& button, int direction);

  const FolderTrail& trail_;
  const Events events_;
  std::string folder_;
  wxBitmapButton* back_ = nullptr;
  wxBitmapButton* forward_ = nullptr;
  CrumbStrip* crumbs_ = nullptr;
  wxTextCtrl* edit_ = nullptr;
  std::string namesOf_;             // the folder that is typed so far
  std::vector<std::string> names_;  // of the folders in it
  // of the field's text when it was last looked at, without what completes it
  size_t typedLength_ = 0;
  LooseWork reading_;
};

}  // namespace fotomill::desktop
