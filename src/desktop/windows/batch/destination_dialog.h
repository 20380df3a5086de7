#pragma once

#include <wx/dialog.h>
#include <wx/sizer.h>

#include <string>
#include <vector>

#include "desktop/models/batch/destination_choice.h"
#include "desktop/models/batch/named_sizes.h"
#include "operations/recipe_library.h"

class wxButton;
class wxCheckBox;
class wxChoice;
class wxComboBox;
class wxRadioButton;
class wxSpinCtrl;
class wxStaticText;
class wxTextCtrl;

namespace fotomill::desktop {

// The destination step of a function: format, folder, and how to handle colors and metadata. The
// folder is in the same window, in a second step, or not asked for (DestinationParts).
class DestinationDialog : public wxDialog {
 public:
  // `verb` is the label of OK: "Convert". With `resizes`, the first size of the settings is chosen,
  // else that of the last time. `recipe` is applied to every picture; nothing is then chosen as the
  // last time, and a recipe whose outputs have formats decides the format.
  DestinationDialog(wxWindow* parent, const wxString& verb, const std::vector<std::string>& files,
                    bool resizes = false, std::string recipe = {});
  DestinationChoice Choice() const;

 private:
  void BuildFormat();
  void AddRow(wxSizer& grid, const wxString& label, wxSizer* controls);
  void BuildFormatRow(wxSizer& grid);
  void BuildSizeRow(wxSizer& grid);
  void BuildQualityRow(wxSizer& grid);
  void BuildNameRow(wxSizer& grid);
  void BuildRecipeRow(wxSizer& grid);
  void ChooseFormat(size_t format);
  const DestinationFormat& ChosenFormat() const;
  void FormatChosen();
  void LimitChosen();
  void OfferMacros(wxWindow& button);
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
  const bool resizes_;
  const std::string own_;       // the caller's recipe
  const bool ownFormats_;       // it decides the format
  const DestinationChoice last_;
  const std::vector<NamedRecipe> recipes_ = ListRecipes();
  wxChoice* format_ = nullptr;
  int line_ = wxNOT_FOUND, chosen_ = 0;  // items of the list of formats
  wxComboBox* size_ = nullptr;
  wxChoice* limit_ = nullptr;
  wxSpinCtrl* number_ = nullptr;  // the quality, or the limit in KB
  wxTextCtrl* name_ = nullptr;
  wxChoice* recipe_ = nullptr;
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
