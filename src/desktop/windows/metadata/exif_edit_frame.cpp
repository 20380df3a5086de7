#include "desktop/windows/metadata/exif_edit_frame.h"

#include <wx/accel.h>
#include <wx/button.h>
#include <wx/checkbox.h>
#include <wx/dataview.h>
#include <wx/hyperlink.h>
#include <wx/msgdlg.h>
#include <wx/richmsgdlg.h>
#include <wx/sizer.h>
#include <wx/srchctrl.h>
#include <wx/statbox.h>
#include <wx/stattext.h>
#include <wx/textdlg.h>

#include <algorithm>

#include "batch/rewrite/exif_file.h"
#include "desktop/models/shell/event_log.h"
#include "desktop/windows/metadata/exif_value_panel.h"
#include "desktop/windows/metadata/place_dialog.h"
#include "desktop/windows/metadata/rewrite_batch.h"
#include "desktop/windows/shell/browser_tabs.h"
#include "desktop/windows/shell/shell.h"
#include "desktop/windows/widgets/wx_text.h"
#include "metadata/edit/exif_dates.h"
#include "metadata/gps.h"
#include "platform/paths.h"
#include "settings/configuration.h"
#include "settings/exif_settings.h"
#include "settings/settings.h"
#include "texts/texts.h"

namespace fotomill::desktop {

namespace {

constexpr size_t kMostSummaryLines = 12;
const wxString kMark = wxString::FromUTF8("\xE2\x97\x8F");
enum Column { kMarkColumn, kNameColumn, kValueColumn };
enum { kShiftId = wxID_HIGHEST + 1, kPlaceId, kOwnerId };

wxString TitleOf(const std::vector<std::string>& paths) {
  if (paths.size() == 1) return Label("Edit EXIF: %1", Shown(platform::FileNameOf(paths.front())));
  return LabelCount("Edit EXIF: %1 file", "Edit EXIF: %1 files", paths.size());
}

wxString ValueText(const ExifEditRow& row, size_t files) {
  if (row.removed) return Label("(removed)");
  if (row.mixed) return Label("(different values)");
  const wxString text = wxString::FromUTF8(row.text);
  if (row.changed || row.files == 0 || row.files == files) return text;
  return Label("%1 (in %2 of %3 files)", text, row.files, files);
}

// Asks a question with a box to turn it off; `key` is its setting. Without it, the first answer
// holds, so the box has no effect on the others.
int AskUnlessOff(wxWindow& parent, const wxString& question, const wxString& details, long style,
                 const std::vector<wxString>& buttons, int32_t& key) {
  wxRichMessageDialog dialog(&parent, question, Label("Edit EXIF"), style | wxICON_QUESTION);
  dialog.SetExtendedMessage(details);
  if (buttons.size() == 2) {
    dialog.SetYesNoCancelLabels(buttons[0], buttons[1], wxID_CANCEL);
  } else {
    dialog.SetOKCancelLabels(buttons[0], wxID_CANCEL);
  }
  dialog.ShowCheckBox(Label("Do not ask again (can be re-enabled in Setup)"));
  LogEvent("prompt", "exif " + Utf8(question));
  const int answer = dialog.ShowModal();
  if ((answer == wxID_OK || answer == wxID_YES) && dialog.IsCheckBoxChecked()) {
    key = 0;
    (void)SaveConfiguration();
  }
  return answer;
}

}  // namespace

ExifEditFrame::ExifEditFrame(Shell& shell, wxWindow* parent, std::vector<std::string> files)
    : ToolFrame(parent, TitleOf(files), "ExifEditBox"), shell_(shell), paths_(std::move(files)) {
  problem_ = new wxStaticText(Panel(), wxID_ANY, Label("Reading..."));
  list_ = NewTextList(Panel(), Label("EXIF values"),
                      {{"", 24}, {Label("Name"), 240}, {Label("Value"), 300}});
  list_->Bind(wxEVT_DATAVIEW_SELECTION_CHANGED, [this](wxDataViewEvent&) { ShowSelected(); });
  list_->Bind(wxEVT_DATAVIEW_ITEM_ACTIVATED, [this](wxDataViewEvent&) { value_->FocusValue(); });

  auto* middle = new wxBoxSizer(wxHORIZONTAL);
  auto* left = new wxBoxSizer(wxVERTICAL);
  left->Add(BuildSearch(), wxSizerFlags().Expand().Border(wxBOTTOM, FromDIP(6)));
  left->Add(list_, wxSizerFlags(1).Expand());
  middle->Add(left, wxSizerFlags(1).Expand());
  middle->Add(BuildSide(), wxSizerFlags().Expand().Border(wxLEFT, FromDIP(10)));
  LayOutWith(*middle);
  Bind(wxEVT_CLOSE_WINDOW, &ExifEditFrame::OnClose, this);
  list_->SetFocus();
  UpdateControls();
  Read();
}

wxSizer* ExifEditFrame::BuildSearch() {
  auto* row = new wxBoxSizer(wxHORIZONTAL);
  search_ = new wxSearchCtrl(Panel(), wxID_ANY);
  search_->SetName(Label("Filter"));
  search_->SetDescriptiveText(Label("Filter"));
  search_->ShowCancelButton(true);
  all_ = new wxCheckBox(Panel(), wxID_ANY, Label("Show &all tags"));
  all_->SetToolTip(Label("Also shows tags that the files do not have, to add them."));
  row->Add(search_, wxSizerFlags(1).CenterVertical());
  row->Add(all_, wxSizerFlags().CenterVertical().Border(wxLEFT, FromDIP(10)));
  search_->Bind(wxEVT_TEXT, [this](wxCommandEvent&) { ShowRows(); });
  search_->Bind(wxEVT_SEARCH_CANCEL, [this](wxCommandEvent&) { search_->Clear(); });
  all_->Bind(wxEVT_CHECKBOX, [this](wxCommandEvent&) { ShowRows(); });
  return row;
}

wxSizer* ExifEditFrame::BuildSide() {
  auto* side = new wxBoxSizer(wxVERTICAL);
  value_ =
      new ExifValuePanel(Panel(), {.entered = [this](const std::string& text) { Entered(text); },
                                   .removed = [this] { ChangeSelected(&ExifEditor::Remove); },
                                   .reverted = [this] { ChangeSelected(&ExifEditor::Revert); }});
  side->Add(value_, wxSizerFlags(1).Expand());
  auto* box = new wxStaticBoxSizer(wxVERTICAL, Panel(), Label("Place"));
  wxWindow* const parent = box->GetStaticBox();
  place_ = new wxStaticText(parent, wxID_ANY, "");
  map_ = new wxHyperlinkCtrl(parent, wxID_ANY, Label("Show on OpenStreetMap"), "https://");
  box->Add(place_, wxSizerFlags().Expand().Border(wxALL, FromDIP(6)));
  box->Add(map_, wxSizerFlags().Border(wxLEFT | wxRIGHT | wxBOTTOM, FromDIP(6)));
  side->Add(box, wxSizerFlags().Expand());
  return side;
}

void ExifEditFrame::LayOutWith(wxSizer& contents) {
  const RowButton rows[] = {
      {kPlaceId, TrLater("&Place..."), [this] { SetPlace(); }},
      {kShiftId, TrLater("Shift &times..."), [this] { ShiftTimes(); }},
      {kOwnerId, TrLater("&Owner values"), [this] { SetOwner(); }},
      {wxID_CLOSE, TrLater("C&lose"), [this] { Close(); }},
      {wxID_SAVE, TrLater("&Write"), [this] { Write(); }},
  };
  LayOut(problem_, contents, rows, {{wxACCEL_CTRL, 'S', wxID_SAVE}, {wxACCEL_CTRL, 'F', wxID_FIND}},
         wxSize(980, 640));
  FindWindow(kOwnerId)->SetToolTip(
      Label("Sets artist, copyright and the other values on the page EXIF and info of Setup."));
  Bind(
      wxEVT_MENU, [this](wxCommandEvent&) { search_->SetFocus(); }, wxID_FIND);
}

// --- reading ---

void ExifEditFrame::Read() {
  work_.Start(
      *this,
      [this](const StopToken& stop) {
        read_.clear();
        for (const std::string& path : paths_) {
          if (stop.Asked()) return;
          read_.push_back(ReadExifFile(path));
        }
      },
      [this](Status) { FilesRead(); });
}

void ExifEditFrame::ReadIfChanged() {
  const bool changed = std::ranges::any_of(editor_.Files(), [](const ExifFileTexts& file) {
    return !(platform::StampOf(file.path) == file.stamp);
  });
  if (changed) Read();
}

void ExifEditFrame::FilesRead() {
  editor_.SetFiles(std::move(read_));
  const size_t files = editor_.Files().size(), good = editor_.Changeable().size();
  wxString problem;
  if (good == 0 && !editor_.Files().empty()) {
    problem = Shown(editor_.Files().front().problem);
  } else if (good < files) {
    problem = LabelCount("%1 file cannot be changed and is left out.",
                         "%1 files cannot be changed and are left out.", files - good);
  }
  problem_->SetLabel(problem);
  problem_->Show(!problem.empty());
  ShowRows();
  Layout();
  LogEvent("exif-edit", "files=" + std::to_string(good) + " rows=" + std::to_string(rows_.size()));
}

void ExifEditFrame::ShowRows() {
  const int selected = list_->GetSelectedRow();
  const int tag = selected == wxNOT_FOUND ? -1 : rows_[static_cast<size_t>(selected)].tag;
  rows_ = editor_.Changeable().empty() ? std::vector<ExifEditRow>()
                                       : editor_.Rows(all_->GetValue(), Utf8(search_->GetValue()));
  list_->DeleteAllItems();
  size_t again = 0;
  for (size_t i = 0; i < rows_.size(); ++i) {
    wxVector<wxVariant> cells;
    cells.push_back(rows_[i].changed ? kMark : wxString());
    cells.push_back(Shown(rows_[i].name));
    cells.push_back(ValueText(rows_[i], editor_.Changeable().size()));
    list_->AppendItem(cells);
    if (rows_[i].tag == tag) again = i;
  }
  if (!rows_.empty()) {
    list_->SelectRow(static_cast<unsigned>(again));
    list_->EnsureVisible(list_->RowToItem(static_cast<int>(again)));
  }
  ShowSelected();
  ShowPlace();
}

void ExifEditFrame::UpdateRow(size_t place) {
  const ExifEditRow& row = rows_[place];
  const auto line = static_cast<unsigned>(place);
  list_->SetTextValue(row.changed ? kMark : wxString(), line, kMarkColumn);
  list_->SetTextValue(ValueText(row, editor_.Changeable().size()), line, kValueColumn);
}

void ExifEditFrame::ShowSelected() {
  const int row = list_->GetSelectedRow();
  invalid_ = false;
  if (row == wxNOT_FOUND) {
    value_->ShowNothing();
  } else {
    value_->ShowRow(rows_[static_cast<size_t>(row)], editor_.Changeable().size());
  }
  UpdateControls();
}

void ExifEditFrame::ShowPlace() {
  bool mixed = false;
  const auto place = editor_.Place(mixed);
  std::string text = mixed ? Tr("The files have different places.") : Tr("No place");
  if (place) {
    text = GpsPlaceText(place->latitude, place->longitude);
    if (const size_t decimals = text.find(" ("); decimals != std::string::npos)
      text[decimals] = '\n';
    map_->SetURL(Shown(MapLink(*place)));
  }
  const std::string note = editor_.PlaceNote();
  if (!note.empty()) text.append("\n").append(note);
  place_->SetLabel(wxString::FromUTF8(text));
  map_->Show(place.has_value());
  place_->GetParent()->GetParent()->Layout();
}

void ExifEditFrame::UpdateControls() {
  const size_t files = editor_.Changeable().size();
  const bool ready = files > 0 && !writing_;
  for (const wxWindowID id : {kPlaceId, kShiftId, kOwnerId}) FindWindow(id)->Enable(ready);
  auto* write = static_cast<wxButton*>(FindWindow(wxID_SAVE));
  write->SetLabel(LabelCount("&Write %1 file", "&Write %1 files", std::max<size_t>(files, 1)));
  write->Enable(ready && !invalid_ && editor_.HasChanges());
  write->GetParent()->Layout();
}

// --- changes ---

// What is entered while values are written would not be among them, so it is taken back.
void ExifEditFrame::Entered(const std::string& text) {
  if (writing_) {
    wxBell();
    return ShowSelected();
  }
  const int selected = list_->GetSelectedRow();
  if (selected == wxNOT_FOUND) return;
  ExifEditRow& row = rows_[static_cast<size_t>(selected)];
  const std::string problem = editor_.Set(row.tag, text);
  invalid_ = !problem.empty();
  row = editor_.Row(row.tag);
  UpdateRow(static_cast<size_t>(selected));
  value_->UpdateControls(row, problem);
  UpdateControls();
  LogEvent("exif-edit-value", row.name + ": " + (invalid_ ? "invalid" : row.text));
}

void ExifEditFrame::ChangeSelected(void (ExifEditor::*change)(uint16_t tag)) {
  if (writing_) return wxBell();
  const int selected = list_->GetSelectedRow();
  if (selected == wxNOT_FOUND) return;
  (editor_.*change)(rows_[static_cast<size_t>(selected)].tag);
  ShowRows();
}

void ExifEditFrame::ShiftTimes() {
  wxString text = "+0:00:00";
  for (;;) {
    wxTextEntryDialog dialog(this,
                             Label("Add to all dates and times, such as +1:30:00 or -0:05:00:"),
                             Label("Shift times"), text);
    LogEvent("prompt", "shift");
    if (dialog.ShowModal() != wxID_OK) return;
    text = dialog.GetValue();
    if (const auto shift = ParseTimeShift(Utf8(text))) {
      editor_.Shift(*shift);
      return ShowRows();
    }
    wxMessageBox(Label("\"%1\" is not a time difference such as +1:30:00.", text),
                 Label("Shift times"), wxOK | wxICON_WARNING, this);
  }
}

void ExifEditFrame::SetPlace() {
  if (AskForPlace(*this, editor_)) {
    ShowRows();
    LogEvent("exif-edit", "place");
  }
}

void ExifEditFrame::SetOwner() {
  ExifChanges changes;
  std::string reason;
  if (!OwnerChanges(changes, reason)) {
    wxMessageBox(Shown(reason), Label("Owner values"), wxOK | wxICON_INFORMATION, this);
    return;
  }
  editor_.Set(changes);
  ShowRows();
}

// --- writing ---

bool ExifEditFrame::ConfirmWrite() {
  if (settings.ExifConfirmWrite == 0) return true;
  const std::vector<std::string> lines = editor_.Summary();
  wxString details;
  for (size_t i = 0; i < std::min(lines.size(), kMostSummaryLines); ++i)
    details += Shown(lines[i]) + "\n";
  if (lines.size() > kMostSummaryLines)
    details += LabelCount("and %1 more", "and %1 more", lines.size() - kMostSummaryLines);
  const size_t files = editor_.Changeable().size();
  const wxString question =
      LabelCount("Write these values to %1 file?", "Write these values to %1 files?", files);
  return AskUnlessOff(*this, question, details, wxOK | wxCANCEL, {Label("&Write")},
                      settings.ExifConfirmWrite) == wxID_OK;
}

bool ExifEditFrame::ConfirmAdding(bool& addNew) {
  if (settings.ExifConfirmAddNew == 0 || !editor_.Adds()) return true;
  const int answer = AskUnlessOff(
      *this, Label("Some files do not have all of these tags. Add them?"), {}, wxYES_NO | wxCANCEL,
      {Label("&Add"), Label("&Change existing only")}, settings.ExifConfirmAddNew);
  addNew = answer == wxID_YES;
  return answer != wxID_CANCEL;
}

void ExifEditFrame::Write() {
  bool addNew = true;
  if (!ConfirmAdding(addNew) || !ConfirmWrite()) return;
  RewriteFunction function;
  function.unchanged = TrLater("already so.");
  function.listedTwice = TrLater("listed twice; already changed.");
  function.rewrite = [changer = editor_.Changer(addNew)](
                         const std::string& source, const std::string& destination,
                         const RewriteRequest& request, const WriteOptions& options) {
    return EditExifFile(source, destination, changer, request, options);
  };
  writing_ = true;
  UpdateControls();
  LogEvent("exif-edit", "writing");
  RunRewriteBatch(shell_, editor_.Changeable(), std::move(function), {}, alive_,
                  [this](bool errors) { Written(errors); });
}

void ExifEditFrame::Written(bool errors) {
  writing_ = false;
  if (!errors) editor_.Clear();
  UpdateControls();
  Read();
}

// The changes are kept until all files are written, as some may fail.
void ExifEditFrame::OnClose(wxCloseEvent& event) {
  if (event.CanVeto() && editor_.HasChanges()) {
    const wxString question =
        writing_ ? Label(
                       "The values are still being written. Close anyway? Changes to files that "
                       "cannot be written would be lost.")
                 : Label("Close without writing the changes?");
    wxMessageDialog dialog(this, question, Label("Edit EXIF"),
                           wxOK | wxCANCEL | wxCANCEL_DEFAULT | wxICON_QUESTION);
    if (writing_) {
      dialog.SetOKCancelLabels(Label("&Close"), Label("&Keep open"));
    } else {
      dialog.SetOKCancelLabels(Label("&Discard"), Label("&Keep editing"));
    }
    LogEvent("prompt", writing_ ? "exif writing" : "exif discard");
    if (dialog.ShowModal() != wxID_OK) return event.Veto();
  }
  event.Skip();
}

void EditExifOfSelection(Shell& shell) {
  std::vector<std::string> files = shell.Tabs().SelectedFiles();
  if (!files.empty()) (new ExifEditFrame(shell, &shell.Window(), std::move(files)))->Show();
}

void RefreshExifEditors() {
  for (wxWindow* window : wxTopLevelWindows) {
    auto* editor = dynamic_cast<ExifEditFrame*>(window);
    if (editor != nullptr && !editor->writing_) editor->ReadIfChanged();
  }
}

}  // namespace fotomill::desktop
