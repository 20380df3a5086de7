#pragma once

#include <wx/panel.h>

#include <functional>
#include <vector>

class wxButton;
class wxStaticText;

namespace fotomill::desktop {

// The offer to create missing thumbnail files, as a line above the list.
class UpdateBar : public wxPanel {
 public:
  // `answered` receives the choice, 0 if the bar was closed.
  UpdateBar(wxWindow* parent, std::function<void(int32_t choice)> answered);
  // `selected` is the answer of the last time.
  void Ask(int32_t count, int32_t selected);
  // Shows progress instead of a question; closing the bar cancels.
  void Report(const wxString& text);

 private:
  const std::function<void(int32_t choice)> answered_;
  wxStaticText* text_ = nullptr;
  std::vector<wxButton*> answers_;  // in the order of kAnswers
};

}  // namespace fotomill::desktop
