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

// The path of a browser with navigation: back, forward, up, parent folders and their subfolders,
// and a field to type a path.
class PathBar : public wxPanel {
 public:
  // User actions.
  struct Events {
    std::function<void(int steps)> step;  // back or forward in the trail
    std::function<void()> up;
    std::function<void(const std::string& folder)> open;  // an existing folder
    std::function<void()> left;                           // with Escape
  };
  // `trail` belongs to the browser and must outlive the bar.
  PathBar(wxWindow* parent, const FolderTrail& trail, Events events);

  // The browser's folder has changed: updates path and buttons.
  void ShowFolder(const std::string& folder);
  // Lets the user type a folder, instead of the buttons.
  void Edit();
  // Shows a menu of the visited folders.
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
  std::string namesOf_;             // the folder typed so far
  std::vector<std::string> names_;  // of its subfolders
  // length of the last text, without the completion
  size_t typedLength_ = 0;
  LooseWork reading_;
};

}  // namespace fotomill::desktop
