#pragma once

#include <wx/panel.h>

#include <string>
#include <vector>

class wxChoice;

namespace fotomill::desktop {

// The language of the windows: that of the system, or one of the installed translations.
class LanguagePanel : public wxPanel {
 public:
  explicit LanguagePanel(wxWindow* parent);

  // Stores what is chosen. The first time it differs from before, a message says when it takes
  // effect.
  void Store();

 private:
  std::string Chosen() const;

  wxChoice* choice_ = nullptr;
  std::vector<std::string> codes_;  // of the lines; empty: the system's language
};

}  // namespace fotomill::desktop
