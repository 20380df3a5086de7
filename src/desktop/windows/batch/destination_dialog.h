#pragma once

#include <wx/dialog.h>
#include <wx/sizer.h>

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
class wxTextCtrl;

namespace fotomill::desktop {

// The destination step of a function: format, folder, and what becomes of colors and metadata. The
// folder comes in the same window at once, behind the format, or not at all (DestinationParts).
class DestinationDialog : public wxDialog {
 public:
  // `verb` is what OK does: "Convert". With `sizes`, pictures are also resized to one of them.
  DestinationDialog(wxWindow* parent, const wxString& verb, const std::vector<std::string>& files,
                    std::vector<NamedSize> sizes = {});
  DestinationChoice Choice() const;

 private:
  void BuildFormat();
  wxSizer* NewSizeRow();
  void BuildFolder();
  void BuildOptions();
  void BuildButtons(const wxString& verb);
  void BindControls();
  wxSizerFlags Below() const;  // of a row under the one before
  void ShowPart(size_t part);
  void UpdateControls();
  bool ShowFormatOptions();  // false: canceled
  std::string OutlookText(const DestinationChoice& choice) const;
  void Browse();
  void OnKey(wxKeyEvent& event);
  bool Accept(bool shift);  // false: the step is not over

  const std::vector<std::string> files_;
  const std::string shownFolder_;  // in which relative folders are
  const std::vector<DestinationFormat> formats_ = DestinationFormats();
  const std::vector<DestinationPart> parts_ = DestinationParts();
  size_t part_ = 0;  // that is shown
  wxString okText_;
  wxSizer* formatSizer_ = nullptr;  // of the controls for each part
  wxSizer* folderSizer_ = nullptr;
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
  wxTextCtrl* comment_ = nullptr;  // null unless PromptForFileComments is on
  wxStaticText* preview_ = nullptr;
  wxButton* ok_ = nullptr;
};

}  // namespace fotomill::desktop
