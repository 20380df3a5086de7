#pragma once

#include <wx/panel.h>

#include <functional>
#include <string>
#include <vector>

#include "desktop/models/metadata/exif_editor.h"

class wxButton;
class wxChoice;
class wxSizer;
class wxStaticText;
class wxTextCtrl;

namespace fotomill::desktop {

// Shows and edits the value of one EXIF tag: a text, a date with a calendar, a word of a list, or
// the parts of a flash value.
class ExifValuePanel : public wxPanel {
 public:
  struct Events {
    std::function<void(const std::string& text)> entered;  // a value, as typed
    std::function<void()> removed;                         // the tag
    std::function<void()> reverted;                        // to the value in the files
  };
  ExifValuePanel(wxWindow* parent, Events events);

  // Shows a tag of `files` files.
  void ShowRow(const ExifEditRow& row, size_t files);
  void ShowNothing();
  // Call after a value was entered, with the row shown; `problem`: why it is invalid.
  void UpdateControls(const ExifEditRow& row, const std::string& problem);
  void FocusValue();

 private:
  void BuildValue();
  void BuildFlash();
  void ShowControl(const ExifEditRow& row);
  void SetNote(const wxString& text);
  void PickDate();
  void EnterFlash();

  const Events events_;
  uint16_t tag_ = 0;
  ExifControl control_ = ExifControl::None;
  wxStaticText* name_ = nullptr;
  // A mnemonic focuses the control after its label, so that each has its own.
  wxStaticText* textLabel_ = nullptr;
  wxStaticText* wordsLabel_ = nullptr;
  wxTextCtrl* text_ = nullptr;
  wxButton* calendar_ = nullptr;
  wxChoice* words_ = nullptr;
  wxSizer* textRow_ = nullptr;
  wxSizer* flashRows_ = nullptr;
  std::vector<wxChoice*> flash_;
  wxStaticText* note_ = nullptr;
  wxButton* remove_ = nullptr;
  wxButton* revert_ = nullptr;
};

}  // namespace fotomill::desktop
