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

// The destination step of a function: format, folder, and how to handle colors and metadata. The
// folder is in the same window, in a second step, or not asked for (DestinationParts).
class DestinationDialog : public wxDialog {
 public:
  // `verb` is the label of OK: "Convert". With `sizes`, also resizes pictures to one of them;
  // `recipe` is applied to every picture. A recipe whose outputs have formats decides the format.
  DestinationDialog(wxWindow* parent, const wxString& verb, const std::vector<std::string>& files,
                    std::vector<NamedSize> sizes = {}, std::string recipe = {});
  DestinationChoice Choice() const;

 private:
  void BuildFormat();
  wxSizer* NewSizeRow();
  void BuildFolder();
  void BuildOptions();
  void BuildButtons(const wxString& verb);
  void BindControls();
  wxSizerFlags Below() const;  // for a row below another
  void ShowPart(size_t part);
  void UpdateControls();
  bool ShowFormatOptions();  // false: canceled
  std::string OutlookText(const DestinationChoice& choice) const;
  void Browse();
  void OnKey(wxKeyEvent& event);
  bool Accept(bool shift);  // false: not finished yet

  const std::vector<std::string> files_;
  const std::string shownFolder_;  // base of relative folders
  const std::vector<DestinationFormat> formats_ = DestinationFormats();
  const std::vector<DestinationPart> parts_ = DestinationParts();
  size_t part_ = 0;  // current one
  wxString okText_;
  wxSizer* formatSizer_ = nullptr;  // contains the controls of each part
  wxSizer* folderSizer_ = nullptr;
  const std::vector<NamedSize> sizes_;
  const std::string recipe_;
  const bool ownFormats_;      // the recipe decides the format
  wxChoice* size_ = nullptr;  // null without sizes
  wxChoice* format_ = nullptr;
  wxButton* options_ = nullptr;
  wxRadioButton* beside_ = nullptr;
  wxRadioButton* into_ = nullptr;
  wxComboBox* folder_ = nullptr;
  wxButton* browse_ = nullptr;
  wxCheckBox* reduce_ = nullptr;
  wxCheckBox* orient_ = nullptr;
  wxCheckBox* metadata_ = nullptr;
  wxTextCtrl* comment_ = nullptr;  // null if PromptForFileComments is off
  wxStaticText* preview_ = nullptr;
  wxButton* ok_ = nullptr;
};

}  // namespace fotomill::desktop
