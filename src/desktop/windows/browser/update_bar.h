#pragma once

#include <wx/panel.h>

#include <functional>

class wxChoice;
class wxStaticText;

namespace fotomill::desktop {

// The offer to make missing thumbnail files, as a bar that blocks nothing.
class UpdateBar : public wxPanel {
 public:
  // `answered` gets the choice that was made, 0 when the bar was closed.
  UpdateBar(wxWindow* parent, std::function<void(int32_t choice)> answered);
  void Ask(int32_t count, int32_t selected);
  // What is going on instead of a question; closing the bar ends it.
  void Report(const wxString& text);

 private:
  const std::function<void(int32_t choice)> answered_;
  wxStaticText* text_ = nullptr;
  wxChoice* choices_ = nullptr;
  wxWindow* ok_ = nullptr;
};

}  // namespace fotomill::desktop
