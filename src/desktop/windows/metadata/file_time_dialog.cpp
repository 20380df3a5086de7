#include "desktop/windows/metadata/file_time_dialog.h"

#include <wx/button.h>
#include <wx/checkbox.h>
#include <wx/dataview.h>
#include <wx/dialog.h>
#include <wx/frame.h>
#include <wx/radiobut.h>
#include <wx/sizer.h>
#include <wx/stattext.h>
#include <wx/textctrl.h>

#include <algorithm>
#include <memory>

#include "batch/new_job.h"
#include "batch/rewrite/times_run.h"
#include "desktop/models/metadata/file_time_choice.h"
#include "desktop/models/shell/event_log.h"
#include "desktop/windows/batch/batch_runner.h"
#include "desktop/windows/files/file_actions.h"
#include "desktop/windows/history/history_thumbnails.h"
#include "desktop/windows/metadata/day_dialog.h"
#include "desktop/windows/shell/browser_tabs.h"
#include "desktop/windows/shell/shell.h"
#include "desktop/windows/widgets/button_row.h"
#include "desktop/windows/widgets/looks.h"
#include "desktop/windows/widgets/loose_work.h"
#include "desktop/windows/widgets/wx_text.h"
#include "platform/clock.h"
#include "platform/paths.h"
#include "settings/configuration.h"
#include "settings/job_options.h"
#include "settings/settings.h"
#include "texts/texts.h"

namespace fotomill::desktop {

namespace {

constexpr size_t kMostPreviewed = 500;
constexpr int kThumbnailSide = 32;  // device-independent pixels

class FileTimeDialog : public wxDialog {
 public:
  FileTimeDialog(wxWindow* parent, const std::vector<std::string>& files);
  // The rule for the files, also stored in the settings; none if canceled.
  std::optional<FileTimeRule> Ask();

 private:
  void BuildSources(const FileTimeChoice& choice);
  void BuildFlags(const FileTimeChoice& choice);
  void BuildPreview();
  wxRadioButton* AddSource(const wxString& label, bool first);
  wxTextCtrl* AddField(wxSizer& row, const wxString& name, const std::string& text);
  FileTimeChoice Choice() const;
  void PickDay();
  void UpdateControls();
  void Preview(const FileTimeRule& rule);
  void AddRow(const FileTimeRow& row);
  void WantThumbnails();

  const std::vector<std::string>& files_;
  HistoryThumbnails thumbnails_;
  std::vector<std::string> shown_;  // the files of the list
  size_t failed_ = 0;               // of them
  wxRadioButton* taken_ = nullptr;
  wxRadioButton* given_ = nullptr;
  wxRadioButton* first_ = nullptr;
  wxTextCtrl* time_ = nullptr;
  wxButton* calendar_ = nullptr;
  wxButton* now_ = nullptr;
  wxCheckBox* sequence_ = nullptr;
  wxTextCtrl* step_ = nullptr;
  wxCheckBox* modification_ = nullptr;
  wxCheckBox* access_ = nullptr;
  wxCheckBox* pictures_ = nullptr;
  wxDataViewListCtrl* list_ = nullptr;
  wxStaticText* note_ = nullptr;
  wxButton* ok_ = nullptr;
  LooseWork work_;
};

FileTimeDialog::FileTimeDialog(wxWindow* parent, const std::vector<std::string>& files)
    : wxDialog(parent, wxID_ANY, Label("File Times"), wxDefaultPosition, wxDefaultSize,
               wxDEFAULT_DIALOG_STYLE | wxRESIZE_BORDER, "FileTimeBox"),
      files_(files),
      thumbnails_([this](const std::vector<std::string>& came) {
        for (size_t row = 0; row < shown_.size(); ++row) {
          if (std::ranges::find(came, shown_[row]) == came.end()) continue;
          wxVariant cell;
          cell << wxDataViewIconText(Shown(platform::FileNameOf(shown_[row])),
                                     thumbnails_.Find(shown_[row]));
          list_->SetValue(cell, static_cast<unsigned>(row), 0);
        }
      }) {
  const int gap = FromDIP(10);
  const FileTimeChoice choice = FileTimeChoiceFromSettings();
  SetSizer(new wxBoxSizer(wxVERTICAL));
  BuildSources(choice);
  BuildFlags(choice);
  BuildPreview();
  ok_ = new wxButton(this, wxID_OK,
                     LabelCount("&Set times of %1 file", "&Set times of %1 files", files.size()));
  GetSizer()->Add(BuildAnswerRow(*this, *ok_), wxSizerFlags().Expand().Border(wxALL, gap));
  WantThumbnails();
  UpdateControls();
  GetSizer()->SetSizeHints(this);
  CentreOnParent();
  taken_->SetFocus();
}

wxRadioButton* FileTimeDialog::AddSource(const wxString& label, bool first) {
  auto* radio = new wxRadioButton(this, wxID_ANY, label, wxDefaultPosition, wxDefaultSize,
                                  first ? wxRB_GROUP : 0);
  radio->Bind(wxEVT_RADIOBUTTON, [this](wxCommandEvent&) { UpdateControls(); });
  return radio;
}

wxTextCtrl* FileTimeDialog::AddField(wxSizer& row, const wxString& name, const std::string& text) {
  auto* field = new wxTextCtrl(this, wxID_ANY, Shown(text));
  field->SetName(name);
  field->Bind(wxEVT_TEXT, [this](wxCommandEvent&) { UpdateControls(); });
  row.Add(field, wxSizerFlags(1).CenterVertical().Border(wxLEFT, FromDIP(6)));
  return field;
}

void FileTimeDialog::BuildSources(const FileTimeChoice& choice) {
  const int gap = FromDIP(10);
  const wxSizerFlags below = wxSizerFlags().Expand().Border(wxLEFT | wxRIGHT | wxTOP, gap);
  taken_ = AddSource(Label("When the picture was &taken"), true);
  GetSizer()->Add(taken_, below);
  auto* given = new wxBoxSizer(wxHORIZONTAL);
  given_ = AddSource(Label("Th&is time:"), false);
  given->Add(given_, wxSizerFlags().CenterVertical());
  time_ = AddField(*given, Label("Time"), choice.time);
  calendar_ = new wxButton(this, wxID_ANY, Label("&Calendar..."));
  now_ = new wxButton(this, wxID_ANY, Label("&Now"));
  calendar_->Bind(wxEVT_BUTTON, [this](wxCommandEvent&) { PickDay(); });
  now_->Bind(wxEVT_BUTTON,
             [this](wxCommandEvent&) { time_->SetValue(Shown(LocalTimeText(platform::Now()))); });
  for (wxButton* button : {calendar_, now_})
    given->Add(button, wxSizerFlags().CenterVertical().Border(wxLEFT, FromDIP(6)));
  GetSizer()->Add(given, below);
  first_ = AddSource(Label("The time of the &first file"), false);
  GetSizer()->Add(first_, below);
  auto* sequence = new wxBoxSizer(wxHORIZONTAL);
  sequence_ = new wxCheckBox(this, wxID_ANY, Label("&Each file later than the one before by:"));
  sequence_->SetValue(choice.sequence);
  sequence_->Bind(wxEVT_CHECKBOX, [this](wxCommandEvent&) { UpdateControls(); });
  sequence->Add(sequence_, wxSizerFlags().CenterVertical());
  step_ = AddField(*sequence, Label("Each file later than the one before by"), choice.step);
  step_->SetToolTip(Label("Hours, minutes and seconds, or just seconds"));
  GetSizer()->AddSpacer(FromDIP(6));
  GetSizer()->Add(sequence, wxSizerFlags().Border(wxLEFT, FromDIP(34)));
}

void FileTimeDialog::BuildFlags(const FileTimeChoice& choice) {
  auto* row = new wxBoxSizer(wxHORIZONTAL);
  const auto box = [&](const char* label, bool on) {
    auto* check = new wxCheckBox(this, wxID_ANY, Label(label));
    check->SetValue(on);
    check->Bind(wxEVT_CHECKBOX, [this](wxCommandEvent&) { UpdateControls(); });
    row->Add(check, wxSizerFlags().CenterVertical().Border(wxRIGHT, FromDIP(18)));
    return check;
  };
  modification_ = box(TrLater("Last &modification"), choice.modification);
  access_ = box(TrLater("Last &access"), choice.access);
  row->AddStretchSpacer();
  pictures_ = box(TrLater("Show t&humbnails"), settings.FileTimeShowThumbnail != 0);
  pictures_->Bind(wxEVT_CHECKBOX, [this](wxCommandEvent& event) {
    WantThumbnails();
    event.Skip();
  });
  GetSizer()->Add(row, wxSizerFlags().Expand().Border(wxLEFT | wxRIGHT | wxTOP, FromDIP(14)));
}

void FileTimeDialog::BuildPreview() {
  list_ = new wxDataViewListCtrl(this, wxID_ANY, wxDefaultPosition, wxDefaultSize,
                                 wxDV_SINGLE | wxDV_ROW_LINES);
  list_->SetName(Label("Preview"));
  list_->SetMinSize(wxSize(TextWidth(*this, 680), FromDIP(240)));
  list_->AppendIconTextColumn(Label("File"), wxDATAVIEW_CELL_INERT, TextWidth(*this, 270));
  list_->AppendTextColumn(Label("Old time"), wxDATAVIEW_CELL_INERT, TextWidth(*this, 160));
  list_->AppendTextColumn(Label("New time"), wxDATAVIEW_CELL_INERT, TextWidth(*this, 220));
  note_ =
      new wxStaticText(this, wxID_ANY, "", wxDefaultPosition, wxDefaultSize, wxST_NO_AUTORESIZE);
  const wxSizerFlags below = wxSizerFlags().Expand().Border(wxLEFT | wxRIGHT | wxTOP, FromDIP(10));
  GetSizer()->Add(list_, wxSizerFlags(below).Proportion(1));
  GetSizer()->Add(note_, below);
}

FileTimeChoice FileTimeDialog::Choice() const {
  FileTimeChoice choice;
  choice.source = taken_->GetValue()   ? FileTimeSource::Taken
                  : given_->GetValue() ? FileTimeSource::Given
                                       : FileTimeSource::FirstFile;
  choice.time = Utf8(time_->GetValue());
  choice.sequence = sequence_->GetValue();
  choice.step = Utf8(step_->GetValue());
  choice.modification = modification_->GetValue();
  choice.access = access_->GetValue();
  return choice;
}

void FileTimeDialog::PickDay() {
  const std::string text = Utf8(time_->GetValue());
  const auto day = AskForDay(*this, text);
  if (day) time_->SetValue(Shown(*day + (text.size() > 10 ? text.substr(10) : " 00:00:00")));
}

void FileTimeDialog::UpdateControls() {
  if (ok_ == nullptr) return;  // not complete yet
  for (wxWindow* control : {static_cast<wxWindow*>(time_), static_cast<wxWindow*>(calendar_),
                            static_cast<wxWindow*>(now_), static_cast<wxWindow*>(sequence_)})
    control->Enable(given_->GetValue());
  step_->Enable(first_->GetValue() || (given_->GetValue() && sequence_->GetValue()));
  FileTimeRule rule;
  const std::string problem = ReadFileTimeRule(Choice(), rule);
  ok_->Enable(problem.empty());
  note_->SetLabelText(Shown(problem));
  work_.Stop();
  LogEvent("file-times", problem.empty() ? "valid" : problem);
  if (problem.empty()) Preview(rule);
}

// Pictures are read in the background; a line appears when its file is done.
void FileTimeDialog::Preview(const FileTimeRule& rule) {
  list_->DeleteAllItems();
  shown_.clear();
  failed_ = 0;
  const size_t count = std::min(files_.size(), kMostPreviewed);
  work_.Start(
      [this, files = std::vector(files_.begin(), files_.begin() + static_cast<long>(count)), rule,
       sources = TagSourcesFromSettings()](const StopToken& stop, const LooseWork::Report& report) {
        PreviewFileTimes(files, rule, sources, stop,
                         [&](const FileTimeRow& row) { report([this, row] { AddRow(row); }); });
      });
}

void FileTimeDialog::AddRow(const FileTimeRow& row) {
  wxVector<wxVariant> cells(3);
  cells[0] << wxDataViewIconText(Shown(platform::FileNameOf(row.path)), thumbnails_.Find(row.path));
  cells[1] = Shown(row.before);
  cells[2] = Shown(row.problem.empty() ? row.after : row.problem);
  list_->AppendItem(cells);
  shown_.push_back(row.path);
  failed_ += row.problem.empty() ? 0 : 1;
  wxString note;
  if (files_.size() > kMostPreviewed) note = Label("The first %1 files are shown.", kMostPreviewed);
  if (failed_ > 0)
    note = LabelCount("%1 of the files shown keeps its time.",
                      "%1 of the files shown keep their times.", failed_);
  note_->SetLabelText(note);
  LogEvent("file-time",
           row.path + ": " + row.before + " -> " + (row.problem.empty() ? row.after : row.problem));
}

void FileTimeDialog::WantThumbnails() {
  const double scale = GetContentScaleFactor();
  const int side = pictures_->GetValue() ? FromDIP(kThumbnailSide) : 0;
  const size_t count = std::min(files_.size(), kMostPreviewed);
  thumbnails_.Want({files_.begin(), files_.begin() + static_cast<long>(count)},
                   static_cast<int>(side * scale), scale);
}

std::optional<FileTimeRule> FileTimeDialog::Ask() {
  if (ShowModal() != wxID_OK) return {};
  FileTimeRule rule;
  if (!ReadFileTimeRule(Choice(), rule).empty()) return {};
  StoreFileTimeChoice(Choice());
  settings.FileTimeShowThumbnail = pictures_->GetValue() ? 1 : 0;
  (void)SaveConfiguration();
  return rule;
}

}  // namespace

void SetTimesOfSelection(Shell& shell) {
  const std::vector<std::string> files = shell.Tabs().SelectedFiles();
  if (files.empty()) return;
  FileTimeDialog dialog(&shell.Window(), files);
  LogEvent("prompt", "file-times");
  const auto rule = dialog.Ask();
  if (!rule) return;
  std::vector<BatchFile> batch;
  for (const std::string& file : files) batch.push_back({.name = file, .below = {}, .hint = {}});
  TimesFunction function{.rule = *rule, .sources = TagSourcesFromSettings()};
  const auto done = std::make_shared<FileOperation>();
  done->kind = FileOperationKind::Times;
  function.changed = [done](const std::string&, const FileTimeChange& change) {
    if (change.status == Status::Ok) done->steps.push_back(TimesStep(change.changed));
  };
  shell.Batches().Run(NewBatchJob(), [batch, function, done, &shell](BatchJob& running) {
    const Status status = RunFileTimes(batch, function, running);
    shell.Window().CallAfter([done, &shell] { shell.Files().NoteDone(std::move(*done)); });
    return status;
  });
}

}  // namespace fotomill::desktop
