#pragma once

#include <wx/dialog.h>

#include <string>
#include <vector>

#include "desktop/models/batch/destination_choice.h"
#include "desktop/models/batch/named_sizes.h"

class wxButton;
class wxCheckBox;
class wxChoice;
class wxComboBox;
class wxRadioButton;
class wxStaticText;

namespace fotomill::desktop {

// The destination step of a function: format, folder, and what becomes of colors and metadata.
class DestinationDialog : public wxDialog {
 public:
  // `verb` is what OK does: "Convert". With `sizes`, pictures are also resized to one of them.
  DestinationDialog(wxWindow* parent, const wxString& verb, const std::vector<std::string>& files,
                    std::vector<NamedSize> sizes = {});
  DestinationChoice Choice() const;

 private:
  wxSizer* NewSizeRow();
  void UpdateControls();
  bool ShowFormatOptions();  // false: canceled
  std::string OutlookText(const DestinationChoice& choice) const;
  void Browse();
  void OnKey(wxKeyEvent& event);
  bool Accept(bool shift);  // false: the step is not over

  const std::vector<std::string> files_;
  const std::string shownFolder_;  // in which relative folders are
  const std::vector<DestinationFormat> formats_ = DestinationFormats();
  const std::vector<NamedSize> sizes_;
  wxChoice* size_ = nullptr;  // without sizes, none
  wxChoice* format_ = nullptr;
  wxButton* options_ = nullptr;
  wxRadioButton* beside_ = nullptr;
  wxRadioButton* into_ = nullptr;
  wxComboBox* folder_ = nullptr;
  wxButton* browse_ = nullptr;
  wxCheckBox* reduce_ = nullptr;
  wxCheckBox* orient_ = nullptr;
  wxCheckBox* metadata_ = nullptr;
  wxStaticText* preview_ = nullptr;
  wxButton* ok_ = nullptr;
};

}  // namespace fotomill::desktop
