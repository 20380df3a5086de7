#include "desktop/windows/files/sequential_rename_dialog.h"

#include <wx/button.h>
#include <wx/checkbox.h>
#include <wx/combobox.h>
#include <wx/dialog.h>
#include <wx/listctrl.h>
#include <wx/sizer.h>
#include <wx/spinctrl.h>
#include <wx/stattext.h>
#include <wx/textctrl.h>
#include <wx/wrapsizer.h>

#include <optional>

#include "batch/new_job.h"
#include "batch/outcome_box.h"
#include "batch/rename/pattern_rename.h"
#include "batch/rename/sequential_rename.h"
#include "core/plain_name.h"
#include "desktop/models/shell/event_log.h"
#include "desktop/windows/batch/batch_runner.h"
#include "desktop/windows/dialogs/help.h"
#include "desktop/windows/files/file_actions.h"
#include "desktop/windows/shell/browser_tabs.h"
#include "desktop/windows/shell/shell.h"
#include "desktop/windows/widgets/looks.h"
#include "desktop/windows/widgets/loose_work.h"
#include "desktop/windows/widgets/wx_text.h"
#include "files/rename_log.h"
#include "platform/paths.h"
#include "settings/configuration.h"
#include "settings/history_list.h"
#include "settings/job_options.h"
#include "settings/settings.h"
#include "texts/texts.h"

namespace fotomill::desktop {

namespace {

constexpr size_t kMostPreviewed = 200;
constexpr int kMostNumber = 32760, kMostIncrement = 1000;
constexpr std::string_view kFirstPattern = "%D{%Y-%m-%d} %03c %F";

std::string_view BuiltInBase() { return DefaultText(KeyOf(KeyNumber::SequentialRenameBaseName)); }

struct FlagBox {
  KeyNumber key;
  const char* text;
};
// indices in kFlags
enum Flag : size_t { kSkipColliding, kUpdate, kPrefix, kRandom, kHyphen };
constexpr FlagBox kFlags[] = {
    {KeyNumber::SequentialRenameSkipCollide, TrLater("&Skip colliding files")},
    {KeyNumber::SequentialRenameUpdate, TrLater("&Update base number")},
    {KeyNumber::SequentialRenamePrefix, TrLater("&Prefix")},
    {KeyNumber::SequentialRenameRandom, TrLater("&Random")},
    {KeyNumber::SequentialRenameHyphen, TrLater("&Hyphen")},
};

std::vector<BatchFile> BatchFiles(const std::vector<std::string>& files, size_t most) {
  std::vector<BatchFile> batch;
  for (size_t i = 0; i < std::min(files.size(), most); ++i)
    batch.push_back({.name = files[i], .below = {}, .hint = {}});
  return batch;
}

// What the user chose: names by a pattern, or in sequence.
struct RenameChoice {
  std::optional<PatternRenameOptions> pattern;
  SequentialRenameRules rules;
};

class SequentialRenameDialog : public wxDialog {
 public:
  SequentialRenameDialog(wxWindow* parent, const std::vector<std::string>& files);
  // The user's choice, also saved in the settings; nullopt, with nothing changed, if canceled.
  std::optional<RenameChoice> Ask();

 private:
  void AddPattern(wxSizer& grid);
  SequentialRenameRules ReadControls() const;
  PatternRenameOptions ReadPattern() const;
  void StoreControls() const;
  wxString Problem() const;
  void UpdateControls();
  void ShowPreview(const std::vector<FileOutcome>& outcomes);

  const std::vector<std::string>& files_;
  LooseWork work_;  // the preview by a pattern reads the files
  wxCheckBox* byPattern_ = nullptr;
  wxTextCtrl* pattern_ = nullptr;
  wxComboBox* base_ = nullptr;
  wxSpinCtrl* number_ = nullptr;
  wxSpinCtrl* increment_ = nullptr;
  wxCheckBox* flags_[std::size(kFlags)] = {};
  wxListCtrl* preview_ = nullptr;
  wxStaticText* problem_ = nullptr;
  wxButton* ok_ = nullptr;
};

SequentialRenameDialog::SequentialRenameDialog(wxWindow* parent,
                                               const std::vector<std::string>& files)
    : wxDialog(parent, wxID_ANY, Label("Sequential Rename"), wxDefaultPosition, wxDefaultSize,
               wxDEFAULT_DIALOG_STYLE | wxRESIZE_BORDER, "SequentialRenameBox"),
      files_(files) {
  const int gap = FromDIP(8);
  auto* grid = new wxFlexGridSizer(2, gap, gap);
  grid->AddGrowableCol(1);
  const auto label = [&](const wxString& text) {
    grid->Add(new wxStaticText(this, wxID_ANY, text), wxSizerFlags().CenterVertical());
  };
  label(Label("&Base name:"));
  base_ =
      new wxComboBox(this, wxID_ANY, wxString::FromUTF8(settings.SequentialRenameBaseName.c_str()),
                     wxDefaultPosition, FromDIP(wxSize(300, -1)), 0, nullptr, 0, wxDefaultValidator,
                     Label("Base name"));
  for (const std::string& entry : OfferedEntries(HistoryList::RenameBases, BuiltInBase()))
    base_->Append(wxString::FromUTF8(entry));
  grid->Add(base_, wxSizerFlags(1).Expand());
  const auto spin = [&](const wxString& name, int least, int most, int value) {
    auto* control = new wxSpinCtrl(this, wxID_ANY, "", wxDefaultPosition, wxDefaultSize,
                                   wxSP_ARROW_KEYS, least, most, value, name);
    grid->Add(control);
    control->Bind(wxEVT_SPINCTRL, [this](wxSpinEvent&) { UpdateControls(); });
    return control;
  };
  AddPattern(*grid);
  label(Label("Base &number:"));
  number_ = spin(Label("Base number"), 0, kMostNumber, settings.SequentialRenameBaseNumber);
  label(Label("&Increment:"));
  increment_ = spin(Label("Increment"), 1, kMostIncrement, settings.SequentialRenameIncrement);

  auto* sizer = new wxBoxSizer(wxVERTICAL);
  sizer->Add(grid, wxSizerFlags().Expand().Border(wxALL, gap));
  auto* flags = new wxWrapSizer(wxHORIZONTAL);
  for (size_t i = 0; i < std::size(kFlags); ++i) {
    flags_[i] = new wxCheckBox(this, wxID_ANY, Label(kFlags[i].text));
    flags_[i]->SetValue(NumberIn(KeyOf(kFlags[i].key)) != 0);
    flags_[i]->Bind(wxEVT_CHECKBOX, [this](wxCommandEvent&) { UpdateControls(); });
    flags->Add(flags_[i], wxSizerFlags().Border(wxRIGHT | wxBOTTOM, gap));
  }
  sizer->Add(flags, wxSizerFlags().Expand().Border(wxLEFT | wxRIGHT, gap));
  preview_ =
      new wxListCtrl(this, wxID_ANY, wxDefaultPosition, wxSize(TextWidth(*this, 520), FromDIP(220)),
                     wxLC_REPORT | wxLC_SINGLE_SEL, wxDefaultValidator, Label("New names"));
  preview_->AppendColumn(Label("Old name"), wxLIST_FORMAT_LEFT, TextWidth(*this, 250));
  preview_->AppendColumn(Label("New name"), wxLIST_FORMAT_LEFT, TextWidth(*this, 250));
  sizer->Add(preview_, wxSizerFlags(1).Expand().Border(wxLEFT | wxRIGHT, gap));
  problem_ = new wxStaticText(this, wxID_ANY, "");
  sizer->Add(problem_, wxSizerFlags().Expand().Border(wxLEFT | wxRIGHT | wxTOP, gap));
  auto* buttons = new wxBoxSizer(wxHORIZONTAL);
  auto* help = new wxButton(this, wxID_HELP);
  help->Bind(wxEVT_BUTTON, [this](wxCommandEvent&) { ShowHelp(*this, "RENAME"); });
  ok_ = new wxButton(this, wxID_OK,
                     LabelCount("&Rename %1 file", "&Rename %1 files", files_.size()));
  buttons->Add(help);
  buttons->AddStretchSpacer();
  buttons->Add(new wxButton(this, wxID_CANCEL), wxSizerFlags().Border(wxRIGHT, gap));
  buttons->Add(ok_);
  sizer->Add(buttons, wxSizerFlags().Expand().Border(wxALL, gap));
  ok_->SetDefault();
  SetSizerAndFit(sizer);
  CentreOnParent();
  base_->Bind(wxEVT_TEXT, [this](wxCommandEvent&) { UpdateControls(); });
  base_->Bind(wxEVT_COMBOBOX, [this](wxCommandEvent&) { UpdateControls(); });
  UpdateControls();
  base_->SetFocus();
}

void SequentialRenameDialog::AddPattern(wxSizer& grid) {
  const std::string last(settings.RenamePrevious);
  byPattern_ = new wxCheckBox(this, wxID_ANY, Label("By p&attern:"));
  grid.Add(byPattern_, wxSizerFlags().CenterVertical());
  pattern_ = new wxTextCtrl(this, wxID_ANY, Shown(last.empty() ? kFirstPattern : last));
  pattern_->SetName(Label("Pattern"));
  pattern_->SetToolTip(Label(
      "%F is the old name, %D{%Y-%m-%d} the date when the picture was taken, %03c a counter"));
  grid.Add(pattern_, wxSizerFlags().Expand());
  byPattern_->Bind(wxEVT_CHECKBOX, [this](wxCommandEvent&) {
    const bool on = byPattern_->GetValue();
    number_->SetValue(on ? 1 : settings.SequentialRenameBaseNumber);
    increment_->SetValue(on ? 1 : settings.SequentialRenameIncrement);
    UpdateControls();
    if (on) pattern_->SetFocus();
  });
  pattern_->Bind(wxEVT_TEXT, [this](wxCommandEvent&) { UpdateControls(); });
}

PatternRenameOptions SequentialRenameDialog::ReadPattern() const {
  return {.pattern = Utf8(pattern_->GetValue()),
          .start = number_->GetValue(),
          .increment = increment_->GetValue(),
          .copyrightHolder = std::string(settings.ExifCopyrightHolder),
          .commentExtension = CommentExtensionBesideFromSettings()};
}

// Rules that are not in the dialog come from the settings.
SequentialRenameRules SequentialRenameDialog::ReadControls() const {
  SequentialRenameRules rules = SequentialRenameRulesFromSettings();
  rules.baseName = Utf8(base_->GetValue());
  rules.number = static_cast<uint32_t>(number_->GetValue());
  rules.increment = static_cast<uint32_t>(increment_->GetValue());
  rules.skipColliding = flags_[kSkipColliding]->GetValue();
  rules.update = flags_[kUpdate]->GetValue();
  rules.numberFirst = flags_[kPrefix]->GetValue();
  rules.random = flags_[kRandom]->GetValue();
  rules.separator =
      flags_[kHyphen]->GetValue() ? std::string(settings.SequentialRenameSep) : std::string();
  return rules;
}

void SequentialRenameDialog::StoreControls() const {
  if (byPattern_->GetValue()) {
    settings.RenamePrevious.AssignCut(Utf8(pattern_->GetValue()));
    (void)SaveConfiguration();
    return;
  }
  const bool named = !flags_[kPrefix]->GetValue();  // otherwise the base name is not used
  if (named) settings.SequentialRenameBaseName.AssignCut(Utf8(base_->GetValue()));
  settings.SequentialRenameBaseNumber = number_->GetValue();
  settings.SequentialRenameIncrement = increment_->GetValue();
  for (size_t i = 0; i < std::size(kFlags); ++i)
    StoreNumber(KeyOf(kFlags[i].key), flags_[i]->GetValue() ? 1 : 0);
  if (named)
    (void)AddChoice(HistoryList::RenameBases, settings.SequentialRenameBaseName, BuiltInBase());
  (void)SaveConfiguration();
}

// What is wrong with the input, a sentence; empty if nothing.
wxString SequentialRenameDialog::Problem() const {
  if (byPattern_->GetValue()) {
    const std::string pattern = Utf8(pattern_->GetValue());
    const RecordedText problem = PatternProblem(pattern);
    return problem.empty() ? wxString() : Label("The pattern \"%1\" %2", pattern, problem.shown);
  }
  const std::string base = Utf8(base_->GetValue());
  const bool plain = flags_[kPrefix]->GetValue() || (IsPlainName(base) && !base.empty());
  return plain ? wxString() : Label("The base name must be part of a file name, not a path.");
}

// Shows the new names a run would give; renames nothing.
void SequentialRenameDialog::UpdateControls() {
  const bool byPattern = byPattern_->GetValue();
  pattern_->Enable(byPattern);
  // with the number first, every file keeps its own name after it
  base_->Enable(!byPattern && !flags_[kPrefix]->GetValue());
  for (wxCheckBox* flag : flags_) flag->Enable(!byPattern);
  const wxString problem = Problem();
  ok_->Enable(problem.empty());
  problem_->SetLabel(problem);
  work_.Stop();
  if (!problem.empty()) return;
  const std::vector<BatchFile> files = BatchFiles(files_, kMostPreviewed);
  if (!byPattern) {
    OutcomeBox box;
    BatchJob job;
    job.box = &box;
    RunRename(files,
              {.rules = ReadControls(),
               .seed = 1,
               .commentExtension = CommentExtensionBesideFromSettings(),
               .dryRun = true},
              job);
    return ShowPreview(box.outcomes);
  }
  PatternRenameOptions options = ReadPattern();
  options.dryRun = true;
  work_.Start([this, files, options](const StopToken&, const LooseWork::Report& report) {
    OutcomeBox box;
    BatchJob job;
    job.box = &box;
    RunPatternRename(files, options, job);
    report([this, outcomes = std::move(box.outcomes)] { ShowPreview(outcomes); });
  });
}

void SequentialRenameDialog::ShowPreview(const std::vector<FileOutcome>& outcomes) {
  preview_->Freeze();
  preview_->DeleteAllItems();
  size_t failed = 0;
  for (const FileOutcome& outcome : outcomes) {
    const long row =
        preview_->InsertItem(preview_->GetItemCount(), Shown(platform::FileNameOf(outcome.source)));
    const bool bad = outcome.status != Status::Ok || outcome.skipped;
    failed += bad ? 1 : 0;
    preview_->SetItem(row, 1,
                      bad ? Label("unchanged") : Shown(platform::FileNameOf(outcome.destination)));
    if (bad) preview_->SetItemTextColour(row, ToWx(CurrentPalette().fault));
  }
  preview_->Thaw();
  problem_->SetLabel(failed == 0 ? wxString()
                                 : LabelCount("%1 of the files shown cannot be renamed.",
                                              "%1 of the files shown cannot be renamed.", failed));
  LogEvent("rename-preview", std::to_string(outcomes.size()) + " failed=" + std::to_string(failed));
}

std::optional<RenameChoice> SequentialRenameDialog::Ask() {
  if (ShowModal() != wxID_OK) return std::nullopt;
  StoreControls();
  RenameChoice choice{.pattern = {}, .rules = ReadControls()};
  if (byPattern_->GetValue()) choice.pattern = ReadPattern();
  return choice;
}

// Adds the renames of the last run to the frame's undo list. Tabs with found files follow them.
void NoteRenames(Shell& shell) {
  FileOperation operation{FileOperationKind::Rename, {}, CommentExtensionBesideFromSettings()};
  const bool follows = shell.Tabs().FoundPage() != nullptr;
  for (const RenamedFile& file : ReadRenameLog().value_or(RenameHistory()).files) {
    operation.steps.push_back({file.from, file.to});
    if (follows) shell.FollowRename(file.from, file.to);
  }
  shell.Files().NoteDone(std::move(operation));
}

}  // namespace

void RenameSelectionSequentially(Shell& shell) {
  const std::vector<std::string> files = shell.Tabs().SelectedFiles();
  if (files.empty()) return;
  SequentialRenameDialog dialog(&shell.Window(), files);
  LogEvent("prompt", "sequential-rename");
  const std::optional<RenameChoice> choice = dialog.Ask();
  if (!choice) return;
  shell.Batches().Run(NewBatchJob(),
                      [batch = BatchFiles(files, files.size()), choice,
                       comments = CommentExtensionBesideFromSettings(),
                       &shell](BatchJob& running) {
                        if (choice->pattern) {
                          RunPatternRename(batch, *choice->pattern, running);
                        } else {
                          RunRename(batch,
                                    {.rules = choice->rules, .commentExtension = comments},
                                    running);
                        }
                        shell.Window().CallAfter([&shell] { NoteRenames(shell); });
                        return Status::Ok;
                      });
}

}  // namespace fotomill::desktop
