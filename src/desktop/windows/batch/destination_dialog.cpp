#include "desktop/windows/batch/destination_dialog.h"

#include <wx/button.h>
#include <wx/checkbox.h>
#include <wx/choice.h>
#include <wx/combobox.h>
#include <wx/dirdlg.h>
#include <wx/menu.h>
#include <wx/radiobut.h>
#include <wx/sizer.h>
#include <wx/spinctrl.h>
#include <wx/stattext.h>
#include <wx/textctrl.h>

#include <algorithm>

#include "batch/recipe_function.h"
#include "core/choice_lists.h"
#include "core/text.h"
#include "desktop/models/browser/browser_model.h"
#include "desktop/models/shell/event_log.h"
#include "desktop/windows/archive/archive_folders.h"
#include "desktop/windows/setup/override_box.h"
#include "desktop/windows/widgets/wx_text.h"
#include "operations/macros.h"
#include "platform/files.h"
#include "platform/folders.h"
#include "platform/paths.h"
#include "settings/settings.h"
#include "texts/grouped_count.h"

namespace fotomill::desktop {

namespace {

// The choices about quality, and the highest limit.
enum LimitChoice { kAsInSetup, kQuality, kFileSize };
constexpr int kMostKilobytes = 100'000;

}  // namespace

DestinationDialog::DestinationDialog(wxWindow* parent, const wxString& verb,
                                     const std::vector<std::string>& files, bool resizes,
                                     std::string recipe)
    : wxDialog(parent, wxID_ANY, verb, wxDefaultPosition, wxDefaultSize,
               wxDEFAULT_DIALOG_STYLE | wxRESIZE_BORDER, "DestinationBox"),
      files_(files),
      shownFolder_(FolderForResults(platform::FolderOf(files_.front()))),
      resizes_(resizes),
      own_(std::move(recipe)),
      ownFormats_(RecipeNamesFormats(own_)),
      last_(own_.empty() ? LastChoice() : DestinationChoice()) {
  auto* sizer = new wxBoxSizer(wxVERTICAL);
  BuildFormat();
  BuildOptions();
  BuildFolder();
  sizer->Add(formatSizer_, wxSizerFlags().Expand());
  sizer->Add(folderSizer_, wxSizerFlags().Expand());
  preview_ = new wxStaticText(this, wxID_ANY, "", wxDefaultPosition, wxDefaultSize,
                              wxST_NO_AUTORESIZE | wxST_ELLIPSIZE_MIDDLE);
  sizer->Add(preview_, Below());
  SetSizer(sizer);
  BuildButtons(verb);
  BindControls();
  sizer->SetSizeHints(this);
  ShowPart(0);
  CentreOnParent();
}

wxSizerFlags DestinationDialog::Below() const {
  return wxSizerFlags().Expand().Border(wxLEFT | wxRIGHT | wxTOP, FromDIP(12));
}

// Labels on the left, their controls aligned on the right.
void DestinationDialog::BuildFormat() {
  auto* grid = new wxFlexGridSizer(2, FromDIP(8), FromDIP(8));
  grid->AddGrowableCol(1);
  BuildFormatRow(*grid);
  BuildSizeRow(*grid);
  BuildQualityRow(*grid);
  BuildNameRow(*grid);
  BuildRecipeRow(*grid);
  formatSizer_ = new wxBoxSizer(wxVERTICAL);
  formatSizer_->Add(grid, Below());
  recipe_->Enable(own_.empty());
  if (!ownFormats_) return;
  format_->Disable();
  format_->SetToolTip(Label("The recipe decides the format."));
}

void DestinationDialog::AddRow(wxSizer& grid, const wxString& label, wxSizer* controls) {
  auto* const text = new wxStaticText(this, wxID_ANY, label);
  // its key moves to the control after it
  text->MoveBeforeInTabOrder(controls->GetItem(size_t{0})->GetWindow());
  grid.Add(text, wxSizerFlags().CenterVertical());
  grid.Add(controls, wxSizerFlags(1).Expand());
}

// The further formats follow after a line, which cannot be chosen.
void DestinationDialog::BuildFormatRow(wxSizer& grid) {
  format_ = new wxChoice(this, wxID_ANY);
  format_->SetName(Label("Format"));
  for (size_t i = 0; i < formats_.size(); ++i) {
    if (formats_[i].further && (i == 0 || !formats_[i - 1].further)) {
      line_ = static_cast<int>(format_->Append(wxString(24, wxUniChar(0x2500))));
    }
    format_->Append(Shown(formats_[i].description));
  }
  ChooseFormat(FirstFormat(formats_));
  auto* row = new wxBoxSizer(wxHORIZONTAL);
  row->Add(format_, wxSizerFlags(1));
  options_ = new wxButton(this, wxID_ANY, Label("&Options..."));
  row->Add(options_, wxSizerFlags().Border(wxLEFT, FromDIP(8)));
  AddRow(grid, Label("&Format:"), row);
}

void DestinationDialog::ChooseFormat(size_t format) {
  const int place = static_cast<int>(format);
  chosen_ = line_ != wxNOT_FOUND && place >= line_ ? place + 1 : place;
  format_->SetSelection(chosen_);
}

const DestinationFormat& DestinationDialog::ChosenFormat() const {
  const int after = line_ != wxNOT_FOUND && chosen_ > line_ ? 1 : 0;
  return formats_[static_cast<size_t>(chosen_ - after)];
}

// Steps over the line in the direction of the choice.
void DestinationDialog::FormatChosen() {
  const int now = format_->GetSelection();
  if (now == line_) format_->SetSelection(chosen_ < line_ ? line_ + 1 : line_ - 1);
  chosen_ = format_->GetSelection();
  UpdateControls();
}

void DestinationDialog::BuildSizeRow(wxSizer& grid) {
  size_ = new wxComboBox(this, wxID_ANY);
  size_->SetName(Label("Size"));
  size_->SetHint(Label("Original size"));
  size_->SetToolTip(
      Label("The largest width and height, such as 1600x1200, or a percentage; "
            "empty: the original size"));
  for (const NamedSize& size : NamedSizes()) size_->Append(Shown(size.text));
  for (const char* percent : {"75%", "50%", "25%"}) size_->Append(percent);
  if (resizes_) size_->SetSelection(0);
  if (!resizes_ && own_.empty()) size_->SetValue(Shown(settings.DestinationResize.view()));
  size_->Bind(wxEVT_TEXT, [this](wxCommandEvent&) { UpdateControls(); });
  auto* row = new wxBoxSizer(wxHORIZONTAL);
  row->Add(size_, wxSizerFlags(1));
  AddRow(grid, Label("&Size:"), row);
}

void DestinationDialog::BuildQualityRow(wxSizer& grid) {
  limit_ = new wxChoice(this, wxID_ANY);
  limit_->SetName(Label("Quality"));
  for (const char* text : {TrLater("As in Setup"), TrLater("Quality, 1 to 100"),
                           TrLater("Best quality up to a file size, KB")})
    limit_->Append(Label(text));
  limit_->SetSelection(kAsInSetup);
  number_ =
      new wxSpinCtrl(this, wxID_ANY, wxEmptyString, wxDefaultPosition, FromDIP(wxSize(130, -1)));
  number_->SetName(Label("Quality or size"));
  limit_->Bind(wxEVT_CHOICE, [this](wxCommandEvent&) { LimitChosen(); });
  number_->Bind(wxEVT_SPINCTRL, [this](wxSpinEvent&) { UpdateControls(); });
  auto* row = new wxBoxSizer(wxHORIZONTAL);
  row->Add(limit_, wxSizerFlags(1).CenterVertical());
  row->Add(number_, wxSizerFlags().Border(wxLEFT, FromDIP(8)));
  AddRow(grid, Label("&Quality:"), row);
  LimitChosen();
}

void DestinationDialog::LimitChosen() {
  const bool size = limit_->GetSelection() == kFileSize;
  number_->SetRange(1, size ? kMostKilobytes : 100);
  number_->SetValue(size ? 500 : std::clamp(settings.JpegCompression, 1, 100));
  UpdateControls();
}

void DestinationDialog::BuildNameRow(wxSizer& grid) {
  name_ = new wxTextCtrl(this, wxID_ANY, Shown(last_.name));
  name_->SetName(Label("Name"));
  name_->SetHint(Label("As the picture, %F"));
  name_->Bind(wxEVT_TEXT, [this](wxCommandEvent&) { UpdateControls(); });
  auto* insert = new wxButton(this, wxID_ANY, Label("Insert..."));
  insert->Bind(wxEVT_BUTTON, [this, insert](wxCommandEvent&) { OfferMacros(*insert); });
  auto* row = new wxBoxSizer(wxHORIZONTAL);
  row->Add(name_, wxSizerFlags(1).CenterVertical());
  row->Add(insert, wxSizerFlags().Border(wxLEFT, FromDIP(8)));
  AddRow(grid, Label("&Name:"), row);
}

void DestinationDialog::OfferMacros(wxWindow& button) {
  wxMenu menu;
  int id = wxID_HIGHEST + 1;
  for (const MacroRow& macro : Macros()) {
    menu.Append(id++, wxString::FromUTF8(macro.written) + "    " + Label(macro.help));
  }
  const int chosen =
      button.GetPopupMenuSelectionFromUser(menu, wxPoint(0, button.GetSize().y)) - wxID_HIGHEST - 1;
  if (chosen < 0) return;
  name_->WriteText(wxString::FromUTF8(Macros()[static_cast<size_t>(chosen)].written));
  name_->SetFocus();
}

void DestinationDialog::BuildRecipeRow(wxSizer& grid) {
  recipe_ = new wxChoice(this, wxID_ANY);
  recipe_->SetName(Label("Recipe"));
  recipe_->Append(Label("None"));
  for (const NamedRecipe& recipe : recipes_) recipe_->Append(Shown(recipe.name));
  const auto last = std::ranges::find(recipes_, last_.recipe, &NamedRecipe::name);
  recipe_->SetSelection(last == recipes_.end() ? 0 : static_cast<int>(last - recipes_.begin()) + 1);
  recipe_->Bind(wxEVT_CHOICE, [this](wxCommandEvent&) { UpdateControls(); });
  auto* row = new wxBoxSizer(wxHORIZONTAL);
  row->Add(recipe_, wxSizerFlags(1));
  AddRow(grid, Label("R&ecipe:"), row);
}

void DestinationDialog::BuildFolder() {
  const int gap = FromDIP(8);
  folderSizer_ = new wxBoxSizer(wxVERTICAL);
  beside_ = new wxRadioButton(this, wxID_ANY, Label("&Beside each picture"), wxDefaultPosition,
                              wxDefaultSize, wxRB_GROUP);
  into_ = new wxRadioButton(this, wxID_ANY, Label("&Into the folder"));
  // the folder of an unpacked archive is temporary
  const bool temporary = shownFolder_ != platform::FolderOf(files_.front());
  beside_->Enable(!temporary);
  (settings.DestForceSourceDir != 0 && !temporary ? beside_ : into_)->SetValue(true);
  folderSizer_->Add(beside_, Below());
  auto* row = new wxBoxSizer(wxHORIZONTAL);
  folder_ = new wxComboBox(this, wxID_ANY, "", wxDefaultPosition, FromDIP(wxSize(420, -1)), 0,
                           nullptr, 0, wxDefaultValidator, Label("Folder"));
  for (const std::string& folder : RecentDestinations(shownFolder_))
    folder_->Append(wxString::FromUTF8(folder));
  folder_->SetSelection(0);
  folder_->AutoCompleteDirectories();
  browse_ = new wxButton(this, wxID_ANY, Label("B&rowse..."));
  row->Add(into_, wxSizerFlags().CenterVertical().Border(wxRIGHT, gap));
  row->Add(folder_, wxSizerFlags(1));
  row->Add(browse_, wxSizerFlags().Border(wxLEFT, gap));
  folderSizer_->Add(row, Below());
}

// Shown together with the format.
void DestinationDialog::BuildOptions() {
  reduce_ = new wxCheckBox(this, wxID_ANY, Label("Reduce &colors if the format supports fewer"));
  orient_ = new wxCheckBox(this, wxID_ANY, Label("Rotate pictures &upright by EXIF orientation"));
  metadata_ = new wxCheckBox(this, wxID_ANY, Label("&Keep EXIF, XMP and comments"));
  reduce_->SetValue(true);
  orient_->SetValue(settings.ExifAdjustOrientation != 0);
  metadata_->SetValue(settings.PreserveEXIF != 0);
  for (wxCheckBox* box : {reduce_, orient_, metadata_}) formatSizer_->Add(box, Below());
  if (settings.PromptForFileComments == 0) return;
  auto* row = new wxBoxSizer(wxHORIZONTAL);
  row->Add(new wxStaticText(this, wxID_ANY, Label("Co&mment:")),
           wxSizerFlags().CenterVertical().Border(wxRIGHT, FromDIP(8)));
  comment_ = new wxTextCtrl(this, wxID_ANY);
  comment_->SetName(Label("Comment"));
  comment_->SetHint(Label("Empty: each picture keeps its own"));
  row->Add(comment_, wxSizerFlags(1));
  formatSizer_->Add(row, Below());
}

void DestinationDialog::BuildButtons(const wxString& verb) {
  const int gap = FromDIP(8);
  auto* buttons = new wxBoxSizer(wxHORIZONTAL);
  // Translators: %2 is what the button does, "Convert".
  okText_ = LabelCount("%2 &%1 file", "%2 &%1 files", files_.size(), verb);
  ok_ = new wxButton(this, wxID_OK, okText_);
  buttons->AddStretchSpacer();
  buttons->Add(new wxButton(this, wxID_CANCEL), wxSizerFlags().Border(wxRIGHT, gap));
  buttons->Add(ok_);
  GetSizer()->Add(buttons, wxSizerFlags().Expand().Border(wxALL, gap * 3 / 2));
  ok_->SetDefault();
}

void DestinationDialog::BindControls() {
  format_->Bind(wxEVT_CHOICE, [this](wxCommandEvent&) { FormatChosen(); });
  beside_->Bind(wxEVT_RADIOBUTTON, [this](wxCommandEvent&) { UpdateControls(); });
  into_->Bind(wxEVT_RADIOBUTTON, [this](wxCommandEvent&) { UpdateControls(); });
  folder_->Bind(wxEVT_TEXT, [this](wxCommandEvent&) { UpdateControls(); });
  metadata_->Bind(wxEVT_CHECKBOX, [this](wxCommandEvent&) { UpdateControls(); });
  browse_->Bind(wxEVT_BUTTON, [this](wxCommandEvent&) { Browse(); });
  options_->Bind(wxEVT_BUTTON, [this](wxCommandEvent&) { (void)ShowFormatOptions(); });
  ok_->Bind(wxEVT_BUTTON,
            [this](wxCommandEvent& event) { event.Skip(Accept(wxGetKeyState(WXK_SHIFT))); });
  Bind(wxEVT_CHAR_HOOK, &DestinationDialog::OnKey, this);
}

void DestinationDialog::ShowPart(size_t part) {
  part_ = part;
  const bool format = parts_[part] != DestinationPart::Folder;
  GetSizer()->Show(formatSizer_, format, true);
  orient_->Show(format && own_.empty());
  GetSizer()->Show(folderSizer_, parts_[part] != DestinationPart::Format, true);
  ok_->SetLabel(part + 1 < parts_.size() ? Label("Nex&t") : okText_);
  UpdateControls();
  Fit();
  ok_->SetFocus();
  static constexpr const char* kNames[] = {"format", "folder", "both"};
  LogEvent("destination-part", kNames[static_cast<size_t>(parts_[part])]);
}

DestinationChoice DestinationDialog::Choice() const {
  DestinationChoice choice;
  choice.step = own_;
  choice.extension = ChosenFormat().extension;
  if (into_->GetValue()) choice.folder = WholeFolder(Utf8(folder_->GetValue()), shownFolder_);
  choice.reduce = reduce_->GetValue();
  choice.autoOrient = orient_->GetValue();
  choice.keepMetadata = metadata_->GetValue();
  (void)ResizeStep(Utf8(size_->GetValue()), choice.resize);
  choice.name = Utf8(name_->GetValue());
  if (recipe_->GetSelection() > 0)
    choice.recipe = recipes_[static_cast<size_t>(recipe_->GetSelection()) - 1].name;
  if (limit_->IsEnabled() && limit_->GetSelection() == kQuality)
    choice.quality = number_->GetValue();
  if (limit_->IsEnabled() && limit_->GetSelection() == kFileSize)
    choice.mostBytes = static_cast<uint64_t>(number_->GetValue()) * 1024;
  if (comment_ != nullptr && choice.keepMetadata) choice.comment = Utf8(comment_->GetValue());
  return choice;
}

void DestinationDialog::UpdateControls() {
  if (ok_ == nullptr) return;  // during construction
  const bool lossy = !ownFormats_ && HasQuality(UpperCase(ChosenFormat().extension));
  limit_->Enable(lossy);
  number_->Enable(lossy && limit_->GetSelection() != kAsInSetup);
  const DestinationChoice choice = Choice();
  // operations always do this
  orient_->Enable(choice.resize.empty() && choice.recipe.empty());
  folder_->Enable(into_->GetValue());
  browse_->Enable(into_->GetValue());
  if (comment_ != nullptr) comment_->Enable(choice.keepMetadata);
  options_->Show(parts_[part_] != DestinationPart::Folder && HasOverrideBox(choice.extension) &&
                 !ownFormats_);
  std::string step;
  const std::string problem = ResizeStep(Utf8(size_->GetValue()), step)
                                  ? DestinationProblem(choice)
                                  : std::string(Tr("The size is neither like 1600x1200 nor 50%."));
  ok_->Enable(problem.empty() && (!into_->GetValue() || !choice.folder.empty()));
  const std::string outlook = problem.empty() ? OutlookText(choice) : problem;
  LogEvent("destination", outlook);
  preview_->SetLabel(Shown(outlook));
  Layout();
}

// "First: /photos/a.png (18.2 GB free), 3 outputs exist already"
std::string DestinationDialog::OutlookText(const DestinationChoice& choice) const {
  if (ownFormats_) return Tr("The recipe decides formats and names.");
  const DestinationOutlook outlook = OutlookOf(choice, files_);
  std::string text = Tr("First: %1", outlook.first);
  if (outlook.freeSpace > 0)
    text = Tr("%1 (%2 free)", text, SizeText(outlook.freeSpace, choice::kSizeFitting));
  if (outlook.existing > 0)
    text.append(", ").append(
        TrGroupedCount("%1 output exists already", "%1 outputs exist already", outlook.existing));
  return text;
}

bool DestinationDialog::ShowFormatOptions() {
  const std::string& extension = ChosenFormat().extension;
  LogEvent("prompt", "options " + extension);
  return ShowOverrideBox(this, extension);
}

void DestinationDialog::Browse() {
  wxDirDialog dialog(this, Label("Destination folder"), folder_->GetValue());
  if (dialog.ShowModal() == wxID_OK) folder_->SetValue(dialog.GetPath());
  UpdateControls();
}

// The toolkit's default button only reacts to Enter; Shift+Enter is OK with Shift held.
void DestinationDialog::OnKey(wxKeyEvent& event) {
  const bool enter = event.GetKeyCode() == WXK_RETURN || event.GetKeyCode() == WXK_NUMPAD_ENTER;
  if (!enter || event.GetModifiers() != wxMOD_SHIFT) return event.Skip();
  if (ok_->IsEnabled() && Accept(true)) EndModal(wxID_OK);
}

// Accepts the choice, or goes on to the next part. With Shift, shows the format's options first;
// canceling them returns to this step.
bool DestinationDialog::Accept(bool shift) {
  const bool options = shift && ShiftOpensOverrideBox() && HasOverrideBox(Choice().extension) &&
                       parts_[part_] != DestinationPart::Folder;
  if (options && !ShowFormatOptions()) return false;
  if (part_ + 1 < parts_.size()) {
    ShowPart(part_ + 1);
    return false;
  }
  if (!resizes_ && own_.empty()) settings.DestinationResize = SettingText(Utf8(size_->GetValue()));
  KeepChoice(Choice(), shownFolder_);
  return true;
}

}  // namespace fotomill::desktop
