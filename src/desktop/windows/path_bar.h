#pragma once

#include <wx/panel.h>

#include <functional>
#include <string>

class wxTextCtrl;

namespace fotomill::desktop {

// Where a browser is, and the ways from there: back, forward, up, or to a folder that is typed.
class PathBar : public wxPanel {
 public:
  struct Events {
    std::function<void(int steps)> step;  // back or ahead along the tab's trail
    std::function<void()> up;
    std::function<void(const std::string& folder)> open;  // a folder that is there
    std::function<void()> left;                           // by Escape
  };
  PathBar(wxWindow* parent, Events events);

  void ShowFolder(const std::string& folder);
  // Lets the user type a folder.
  void Edit();

 private:
  void TakeTyped();

  const Events events_;
  std::string folder_;
  wxTextCtrl* path_ = nullptr;
};

}  // namespace fotomill::desktop
