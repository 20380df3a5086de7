#pragma once

#include <wx/panel.h>

#include <string>
#include <vector>

class wxChoice;

namespace fotomill::desktop {

// The language of the windows: the system's, or one of the installed translations.
class LanguagePanel : public wxPanel {
 public:
  explicit LanguagePanel(wxWindow* parent);

  // The code of the chosen language; empty: the system's.
  std::string Chosen() const;
  // Stores the choice. On the first change,
  // a message says when it takes effect.
  void Store();

 private:
  wxChoice* choice_ = nullptr;
  std::vector<std::string> codes_;  // per line; empty: system language
};

}  // namespace fotomill::desktop
