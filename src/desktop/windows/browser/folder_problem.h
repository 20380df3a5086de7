#pragma once

#include <wx/panel.h>

#include <functional>

class wxButton;
class wxStaticText;

namespace fotomill::desktop {

// Says in place of a browser's files why its folder cannot be shown, and offers the way up.
class FolderProblem : public wxPanel {
 public:
  // Hidden at first. `up` is called by its button.
  FolderProblem(wxWindow* parent, std::function<void()> up);

  void ShowText(const wxString& text);
  void FocusButton();
  bool HasButtonFocus() const;

 private:
  wxStaticText* text_;
  wxButton* up_;
};

}  // namespace fotomill::desktop
