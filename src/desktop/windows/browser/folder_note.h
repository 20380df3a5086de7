#pragma once

#include <wx/panel.h>

class wxStaticText;

namespace fotomill::desktop {

// A line above the list with what users must know about the folder.
class FolderNote : public wxPanel {
 public:
  explicit FolderNote(wxWindow* parent);
  // Hidden if the text is empty.
  void ShowText(const wxString& text);

 private:
  wxStaticText* text_;
};

}  // namespace fotomill::desktop
