#include "desktop/windows/similar/similar_frame.h"

#include <wx/button.h>
#include <wx/checkbox.h>
#include <wx/choice.h>
#include <wx/dirdlg.h>
#include <wx/gauge.h>
#include <wx/msgdlg.h>
#include <wx/panel.h>
#include <wx/sizer.h>
#include <wx/slider.h>
#include <wx/stattext.h>
#include <wx/textctrl.h>
#include <wx/weakref.h>

#include <algorithm>
#include <memory>
#include <utility>

#include "catalog/history/file_history.h"
#include "core/data_folder.h"
#include "desktop/models/shell/event_log.h"
#include "desktop/models/similar/folder_list_text.h"
#include "desktop/windows/compare/compare_frame.h"
#include "desktop/windows/files/file_actions.h"
#include "desktop/windows/history/use_recorder.h"
#include "desktop/windows/shell/browser_tabs.h"
#include "desktop/windows/shell/picture_windows.h"
#include "desktop/windows/shell/shell.h"
#include "desktop/windows/similar/group_canvas.h"
#include "desktop/windows/similar/problem_box.h"
#include "desktop/windows/widgets/key_commands.h"
#include "desktop/windows/widgets/wx_text.h"
#include "platform/clock.h"
#include "platform/files.h"
#include "settings/configuration.h"
#include "settings/search_options.h"
#include "settings/settings.h"
#include "texts/grouped_count.h"

namespace fotomill::desktop {

namespace {

constexpr size_t kMostCompared = 4;
constexpr int kGaugeRange = 1000;

// What is searched for, in the order of the choice.
enum Kind { kSimilar, kTurned, kIdentical };

constexpr KeyCommand<SimilarFrame> kCommands[] = {
    {TrLater("Com&pare"), "Enter", {WXK_RETURN, WXK_NUMPAD_ENTER}, Of<&SimilarFrame::Compare>},
    {TrLater("&View"), "V", {'V'}, Of<&SimilarFrame::View>},
    {nullptr, nullptr, {}, nullptr},
    {TrLater("Tic&k"), "Space", {}, Of<&SimilarFrame::ToggleTick>},
    {TrLater("&Tick all but the best"), "Ctrl+A", {}, Of<&SimilarFrame::TickAllButBest>},
    {TrLater("&Untick all"), "Ctrl+Shift+A", {}, Of<&SimilarFrame::UntickAll>},
    {TrLater("&Move ticked to the trash"), "Del", {WXK_DELETE}, Of<&SimilarFrame::TrashTicked>},
    {nullptr, nullptr, {}, nullptr},
    {TrLater("Un&do"), "Ctrl+Z", {}, Of<&SimilarFrame::Undo>},
    {TrLater("&Redo"), "Ctrl+Y", {}, Of<&SimilarFrame::Redo>},
};

using States = std::vector<FileNow>;

States StatesOf(const std::vector<SimilarPicture>& pictures) {
  States states;
  for (const SimilarPicture& picture : pictures) states.push_back(StateNow(picture));
  return states;
}

BestRule lastRule = BestRule::Largest;  // until the program ends

}  // namespace

SimilarFrame::SimilarFrame(Shell& shell, const std::vector<std::string>& folders)
    : wxFrame(&shell.Window(), wxID_ANY, Label("Find similar pictures"), wxDefaultPosition,
              wxDefaultSize, wxDEFAULT_FRAME_STYLE, "FotomillProfessionalSimilar"),
      shell_(shell) {
  list_.SetRule(lastRule);
  SetSize(shell.Window().GetSize());
  const int gap = FromDIP(10);
  auto* panel = new wxPanel(this);
  auto* rows = new wxBoxSizer(wxVERTICAL);
  const wxSizerFlags row = wxSizerFlags().Expand().Border(wxLEFT | wxTOP | wxRIGHT, gap);
  rows->Add(BuildFolders(panel), row);
  rows->Add(BuildOptions(panel), row);
  canvas_ =
      new GroupCanvas(panel, list_,
                      {.changed = [this] { UpdateControls(); },
                       .view = [this] { View(); },
                       .menu =
                           [this](const wxPoint& place) {
                             if (canvas_->Focus() != kNoLine)
                               ShowCommandMenu(std::span<const KeyCommand<SimilarFrame>>(kCommands),
                                               *this, *canvas_, place);
                           }});
  rows->Add(canvas_, wxSizerFlags(1).Expand().Border(wxTOP, gap));
  rows->Add(BuildStatus(panel), row);
  rows->Add(BuildButtons(panel), wxSizerFlags().Expand().Border(wxALL, gap));
  panel->SetSizer(rows);
  SetMinSize(panel->GetBestSize() + FromDIP(wxSize(40, 260)));
  if (settings.MaximizeViewWindow != 0) Maximize();
  Bind(wxEVT_CHAR_HOOK, &SimilarFrame::OnKey, this);
  SetFolders(folders);
  ShowDistance();
  canvas_->SetNote(
      Label("Search finds pictures that look alike, also if size, format or "
            "compression differ."));
  UpdateControls();
  search_->SetDefault();
  search_->SetFocus();
}

SimilarFrame::~SimilarFrame() { halt_.Stop(); }

// --- building ---

wxSizer* SimilarFrame::BuildFolders(wxWindow* parent) {
  auto* row = new wxBoxSizer(wxHORIZONTAL);
  const auto apart = wxSizerFlags().CenterVertical().Border(wxRIGHT, FromDIP(8));
  row->Add(new wxStaticText(parent, wxID_ANY, Label("F&olders:")), apart);
  place_ =
      new wxTextCtrl(parent, wxID_ANY, "", wxDefaultPosition, wxDefaultSize, wxTE_PROCESS_ENTER);
  place_->SetName(Label("Folders"));
  place_->SetToolTip(Label("Folders to search, separated by a semicolon and a space"));
  place_->Bind(wxEVT_TEXT_ENTER, [this](wxCommandEvent&) { Begin(); });
  row->Add(place_, wxSizerFlags(1).CenterVertical().Border(wxRIGHT, FromDIP(8)));
  auto* browse = new wxButton(parent, wxID_ANY, Label("&Browse..."));
  browse->Bind(wxEVT_BUTTON, [this](wxCommandEvent&) { Browse(); });
  row->Add(browse, apart);
  subfolders_ = new wxCheckBox(parent, wxID_ANY, Label("With subfo&lders"));
  subfolders_->SetValue(settings.FindSimilarSubfolders != 0);
  row->Add(subfolders_, wxSizerFlags().CenterVertical());
  return row;
}

wxSizer* SimilarFrame::BuildOptions(wxWindow* parent) {
  const SimilarOptions usual = SimilarOptionsFromSettings();
  auto* row = new wxBoxSizer(wxHORIZONTAL);
  const auto next = wxSizerFlags().CenterVertical().Border(wxRIGHT, FromDIP(8));
  const auto apart = wxSizerFlags().CenterVertical().Border(wxRIGHT, FromDIP(20));
  const auto label = [&](const char* text) {
    row->Add(new wxStaticText(parent, wxID_ANY, Label(text)), next);
  };
  const auto choice = [&](const wxString& name, std::initializer_list<const char*> texts) {
    auto* control = new wxChoice(parent, wxID_ANY);
    control->SetName(name);
    for (const char* text : texts) control->Append(Label(text));
    row->Add(control, apart);
    return control;
  };
  label(TrLater("&Find:"));
  kind_ = choice(Label("Find"), {TrLater("Similar pictures"),
                                 TrLater("Similar pictures, also rotated or mirrored"),
                                 TrLater("Identical pictures, pixel by pixel")});
  kind_->SetSelection(usual.transforms ? kTurned : kSimilar);
  kind_->Bind(wxEVT_CHOICE, [this](wxCommandEvent&) { ShowDistance(); });
  label(TrLater("D&ifference:"));
  distance_ = new wxSlider(parent, wxID_ANY, usual.distance, 0, kMostDistance, wxDefaultPosition,
                           FromDIP(wxSize(140, -1)));
  distance_->SetName(Label("Difference"));
  distance_->SetToolTip(
      Label("How many of the 64 bits of two hashes may differ. Matches below 6 are "
            "hardly ever wrong; above 12 they often are."));
  distance_->Bind(wxEVT_SLIDER, [this](wxCommandEvent&) { ShowDistance(); });
  row->Add(distance_, wxSizerFlags().CenterVertical());
  distanceText_ = new wxStaticText(parent, wxID_ANY, "32");
  distanceText_->SetMinSize(distanceText_->GetBestSize());
  row->Add(distanceText_, apart);
  label(TrLater("B&est:"));
  rule_ = choice(Label("Best"),
                 {TrLater("The largest"), TrLater("The sharpest"), TrLater("The oldest")});
  rule_->SetSelection(static_cast<int>(lastRule));
  rule_->SetToolTip(Label("Which picture of a group is suggested to be kept"));
  rule_->Bind(wxEVT_CHOICE, [this](wxCommandEvent&) { RuleChosen(); });
  row->AddStretchSpacer();
  search_ = new wxButton(parent, wxID_ANY, Label("&Search"));
  search_->Bind(wxEVT_BUTTON, [this](wxCommandEvent&) {
    if (work_.Started()) return Leave();
    Begin();
  });
  row->Add(search_, wxSizerFlags().CenterVertical());
  return row;
}

wxSizer* SimilarFrame::BuildStatus(wxWindow* parent) {
  auto* row = new wxBoxSizer(wxHORIZONTAL);
  status_ = new wxStaticText(parent, wxID_ANY, "", wxDefaultPosition, wxDefaultSize,
                             wxST_NO_AUTORESIZE | wxST_ELLIPSIZE_END);
  row->Add(status_, wxSizerFlags(1).CenterVertical());
  gauge_ = new wxGauge(parent, wxID_ANY, kGaugeRange, wxDefaultPosition, FromDIP(wxSize(200, -1)));
  gauge_->SetName(Label("Progress"));
  gauge_->Hide();
  row->Add(gauge_, wxSizerFlags().CenterVertical().ReserveSpaceEvenIfHidden());
  return row;
}

wxSizer* SimilarFrame::BuildButtons(wxWindow* parent) {
  auto* row = new wxBoxSizer(wxHORIZONTAL);
  const auto add = [&](const wxString& label, void (SimilarFrame::*run)()) {
    auto* button = new wxButton(parent, wxID_ANY, label);
    button->Bind(wxEVT_BUTTON, [this, run](wxCommandEvent&) { (this->*run)(); });
    row->Add(button, wxSizerFlags().Border(wxRIGHT, FromDIP(8)));
    return button;
  };
  tick_ = add(Label("&Tick all but the best"), &SimilarFrame::TickAllButBest);
  untick_ = add(Label("&Untick all"), &SimilarFrame::UntickAll);
  compare_ = add(Label("Com&pare"), &SimilarFrame::Compare);
  problemsButton_ = add("", &SimilarFrame::ShowProblems);
  row->AddStretchSpacer();
  auto* close = new wxButton(parent, wxID_CLOSE);
  close->Bind(wxEVT_BUTTON, [this](wxCommandEvent&) { Close(); });
  row->Add(close, wxSizerFlags().Border(wxRIGHT, FromDIP(8)));
  trash_ = new wxButton(parent, wxID_ANY, Label("&Move to the trash"));
  trash_->Bind(wxEVT_BUTTON, [this](wxCommandEvent&) { TrashTicked(); });
  row->Add(trash_);
  return row;
}

void SimilarFrame::SetFolders(const std::vector<std::string>& folders) {
  if (work_.Started()) return;
  folders_ = folders;
  place_->ChangeValue(Shown(FolderListText(folders)));
}

void SimilarFrame::Browse() {
  const std::vector<std::string> now = ParseFolderList(Utf8(place_->GetValue()), folders_);
  wxDirDialog dialog(this, Label("Folder to search"), now.empty() ? wxString() : Shown(now.front()),
                     wxDD_DEFAULT_STYLE | wxDD_DIR_MUST_EXIST);
  if (dialog.ShowModal() == wxID_OK) place_->ChangeValue(dialog.GetPath());
}

void SimilarFrame::ShowDistance() {
  distance_->Enable(kind_->GetSelection() != kIdentical);
  distanceText_->Enable(kind_->GetSelection() != kIdentical);
  distanceText_->SetLabel(std::to_string(distance_->GetValue()));
}

// --- searching ---

SimilarQuestion SimilarFrame::Question() const {
  SimilarQuestion question{
      .folders = ParseFolderList(Utf8(place_->GetValue()), folders_),
      .subfolders = subfolders_->GetValue(),
      .options = SimilarOptionsFromSettings(),
      .sharpness = rule_->GetSelection() == static_cast<int>(BestRule::Sharpest),
      .store = DataFile(kHashStoreName)};
  question.options.exact = kind_->GetSelection() == kIdentical;
  return question;
}

void SimilarFrame::StoreOptions() const {
  settings.FindSimilarSubfolders = subfolders_->GetValue() ? 1 : 0;
  if (kind_->GetSelection() != kIdentical) {
    settings.FindSimilarTransforms = kind_->GetSelection() == kTurned ? 1 : 0;
    settings.FindSimlarDistance = distance_->GetValue();
  }
  (void)SaveConfiguration();
}

// Runs work that reports progress. `halt_` ends it early.
void SimilarFrame::Start(
    const std::function<void(const StopToken& halt, const LooseWork::Report& report)>& work) {
  halt_ = {};
  halted_ = false;
  work_.Start([work, halt = halt_.Token()](const StopToken&,
                                           const LooseWork::Report& report) { work(halt, report); },
              [this] {
                Ended();
                status_->SetLabel(Label("There is not enough memory."));
              });
  ShowProgress({});
  UpdateControls();
}

void SimilarFrame::Begin() {
  if (work_.Started()) return;
  StoreOptions();
  question_ = Question();
  if (question_.folders.empty()) return status_->SetLabel(Label("Which folder is to be searched?"));
  problems_.clear();
  LogEvent("similar", "begun");
  Start([this, question = question_](const StopToken& halt, const LooseWork::Report& report) {
    const auto findings = std::make_shared<SimilarFindings>(
        FindSimilarPictures(question, halt, [&](const SimilarProgress& progress) {
          report([this, progress] { ShowProgress(progress); });
        }));
    report([this, findings] { Found(*findings); });
  });
}

void SimilarFrame::Measure() {
  std::vector<std::string> paths;
  for (const SimilarPicture& picture : list_.All()) paths.push_back(picture.path);
  Start(
      [this, paths, question = question_](const StopToken& halt, const LooseWork::Report& report) {
        const std::vector<float> sharpness =
            MeasurePictures(paths, question, halt, [&](const SimilarProgress& progress) {
              report([this, progress] { ShowProgress(progress); });
            });
        report([this, sharpness] {
          list_.SetSharpness(sharpness);
          Ended();
        });
      });
}

void SimilarFrame::ShowProgress(const SimilarProgress& progress) {
  if (progress.stage != stage_ || progress.done <= 1) stageBegan_ = platform::MonotonicSeconds();
  stage_ = progress.stage;
  const double seconds = platform::MonotonicSeconds() - stageBegan_;
  status_->SetLabel(halted_ ? Label("Stopping...") : Shown(SimilarProgressText(progress, seconds)));
  if (progress.count == 0) {
    gauge_->Pulse();
  } else {
    gauge_->SetValue(static_cast<int>(progress.done * kGaugeRange / progress.count));
  }
}

void SimilarFrame::Found(const SimilarFindings& findings) {
  problems_ = findings.problems;
  std::vector<std::string> found;
  for (const FoundGroup& group : findings.groups) {
    for (const SimilarPicture& picture : group.pictures) found.push_back(picture.path);
  }
  shell_.Uses().NoteAll(found, FileFunction::FindSimilar);
  states_.Forget();  // those of the previous groups
  beforeTrash_.Forget();
  list_.SetGroups(findings.groups);
  canvas_->SetNote(
      Shown(TrGroupedCount("No similar pictures among %1 picture.",
                           "No similar pictures among %1 pictures.", findings.compared)));
  LogEvent("similar", "groups=" + std::to_string(list_.Starts().size()) +
                          " pictures=" + std::to_string(list_.Cells().size()) +
                          " compared=" + std::to_string(findings.compared) + " problems=" +
                          std::to_string(problems_.size()) + (halted_ ? " stopped" : ""));
  const bool any = !list_.Cells().empty();
  Ended();
  if (any) canvas_->SetFocus();
  FilesChanged();  // while the search ran
}

void SimilarFrame::Ended() {
  work_.Stop();
  canvas_->ListChanged();
  UpdateControls();
  LogEvent("similar", "ended");
}

void SimilarFrame::RuleChosen() {
  lastRule = static_cast<BestRule>(rule_->GetSelection());
  list_.SetRule(lastRule);
  canvas_->ListChanged();
  UpdateControls();
  if (lastRule == BestRule::Sharpest && !list_.Measured() && !work_.Started()) Measure();
}

// --- commands ---

void SimilarFrame::Compare() {
  if (canvas_->Focus() == kNoLine) return;
  const std::vector<std::string> files = list_.ToCompare(canvas_->Focus(), kMostCompared);
  (new CompareFrame(shell_, files))->Show();
}

void SimilarFrame::View() {
  const size_t focus = canvas_->Focus();
  if (focus == kNoLine) return;
  std::vector<std::string> files;
  const GroupList::Range group = list_.GroupOf(focus);
  for (size_t cell = group.first; cell < group.end; ++cell)
    files.push_back(list_.Picture(cell).path);
  shell_.Pictures().View(files, list_.Picture(focus).path);
}

void SimilarFrame::ToggleTick() {
  if (canvas_->Focus() != kNoLine) canvas_->TickFocused(!list_.Cells()[canvas_->Focus()].ticked);
}

void SimilarFrame::TickAllButBest() {
  list_.TickAllButBest();
  canvas_->ListChanged();
  UpdateControls();
}

void SimilarFrame::UntickAll() {
  list_.UntickAll();
  canvas_->ListChanged();
  UpdateControls();
}

void SimilarFrame::TrashTicked() {
  if (list_.TickedCount() == 0 || work_.Started()) return wxBell();
  if (shell_.Files().Busy())
    return status_->SetLabel(Label("Please wait for the previous file operation."));
  // Another program may have deleted what is to stay.
  beforeTrash_.Ask<States>(
      [pictures = list_.All()] { return StatesOf(pictures); },
      [this, ticked = list_.TickedCount()](const States& states) {
        if (!work_.Started()) TrashUnlessChanged(ticked, states);
      },
      [this] { status_->SetLabel(Label("Waiting for the files...")); });
}

void SimilarFrame::TrashUnlessChanged(size_t ticked, const std::vector<FileNow>& states) {
  ShowStates(states);
  if (const size_t left = ticked - std::min(ticked, list_.TickedCount()); left > 0) {
    LogEvent("prompt", "similar-left " + std::to_string(left));
    wxMessageBox(
        LabelCount("%1 picture is left alone: it has changed, is gone, or is the last one of its "
                   "group.",
                   "%1 pictures are left alone: they have changed, are gone, or are the last ones "
                   "of their groups.",
                   left),
        Label("Move to the trash"), wxOK | wxICON_INFORMATION, this);
  }
  if (const size_t full = list_.FullyTicked(); full > 0) {
    wxMessageDialog dialog(
        this,
        LabelCount("All pictures of %1 group are ticked. Keep the best one?",
                   "All pictures of %1 groups are ticked. Keep the best ones?", full),
        Label("Move to the trash"), wxYES_NO | wxCANCEL | wxICON_QUESTION);
    dialog.SetYesNoLabels(Label("&Keep the best"), Label("&Trash all"));
    LogEvent("prompt", "similar-all");
    const int answer = dialog.ShowModal();
    if (answer == wxID_CANCEL) return;
    if (answer == wxID_YES) list_.KeepBest();
  }
  std::vector<FileStep> steps;
  for (const SimilarPicture& picture : list_.Ticked())
    steps.push_back({.from = picture.path, .to = {}, .seen = picture.stamp});
  if (!steps.empty()) shell_.Files().TrashSteps(this, std::move(steps));
}

void SimilarFrame::Undo() { shell_.Files().Undo(); }
void SimilarFrame::Redo() { shell_.Files().Redo(); }

void SimilarFrame::Leave() {
  if (!work_.Started()) {
    Close();
    return;
  }
  halt_.Stop();
  halted_ = true;
  status_->SetLabel(Label("Stopping..."));
}

void SimilarFrame::ShowProblems() { ShowProblemBox(*this, problems_); }

// --- changes ---

void SimilarFrame::FilesChanged() {
  if (list_.All().empty()) return;
  states_.Ask<States>([pictures = list_.All()] { return StatesOf(pictures); },
                      [this](const States& states) { ShowStates(states); });
}

void SimilarFrame::ShowStates(const std::vector<FileNow>& states) {
  list_.SetStates(states);
  canvas_->SetNote(Label("There are no similar pictures any more."));
  canvas_->ListChanged();
  UpdateControls();
  LogEvent("similar-states", "groups=" + std::to_string(list_.Starts().size()) +
                                 " pictures=" + std::to_string(list_.Cells().size()));
}

void SimilarFrame::UpdateControls() {
  const bool busy = work_.Started(), any = !list_.Cells().empty();
  const size_t ticked = list_.TickedCount();
  const wxWindow* const focused = FindFocus();
  search_->SetLabel(busy ? Label("&Stop") : Label("&Search"));
  for (wxWindow* control : std::initializer_list<wxWindow*>{place_, subfolders_, kind_, rule_})
    control->Enable(!busy);
  distance_->Enable(!busy && kind_->GetSelection() != kIdentical);
  gauge_->Show(busy);
  tick_->Enable(any && !busy);
  untick_->Enable(ticked > 0 && !busy);
  compare_->Enable(any);
  trash_->Enable(ticked > 0 && !busy);
  trash_->SetLabel(ticked == 0
                       ? Label("&Move to the trash")
                       : LabelCount("&Move %1 to the trash", "&Move %1 to the trash", ticked));
  problemsButton_->Show(!problems_.empty());
  problemsButton_->SetLabel(LabelCount("%1 p&roblem...", "%1 p&roblems...", problems_.size()));
  if (!busy && any) status_->SetLabel(Shown(list_.CountText()));
  if (!busy && !any) status_->SetLabel("");
  // Keys reach nothing while a disabled control has the focus.
  if (focused != nullptr && focused->GetParent() == canvas_->GetParent() && !focused->IsEnabled())
    canvas_->SetFocus();
  trash_->GetContainingSizer()->Layout();
  GetChildren().front()->Layout();
}

void SimilarFrame::OnKey(wxKeyEvent& event) {
  const int key = event.GetKeyCode();
  if (key == WXK_ESCAPE) return Leave();
  const bool onCanvas = FindFocus() == canvas_;
  if (event.ControlDown() && onCanvas) {
    if (key == 'A') return event.ShiftDown() ? UntickAll() : TickAllButBest();
    if (key == 'Z') return Undo();
    if (key == 'Y') return Redo();
  }
  if (!event.HasModifiers() && onCanvas) {
    const auto* command = CommandOfKey(std::span<const KeyCommand<SimilarFrame>>(kCommands), key);
    if (command != nullptr) return command->run(*this);
  }
  event.Skip();
}

namespace {

wxWeakRef<SimilarFrame> shownFrame;

}  // namespace

void FindSimilarInBrowser(Shell& shell) {
  std::vector<std::string> folders;
  if (const BrowserPage* browser = shell.Tabs().Front()) {
    const BrowserModel& model = browser->Model();
    for (const size_t line : model.Selected().SelectedLines()) {
      if (model.Line(line).folder) folders.push_back(model.PathOfLine(line));
    }
  }
  if (folders.empty()) folders.push_back(shell.Tabs().CurrentFolder());
  if (shownFrame == nullptr) {
    shownFrame = new SimilarFrame(shell, folders);
    shownFrame->Show();
  } else {
    shownFrame->SetFolders(folders);
  }
  if (shownFrame->IsIconized()) shownFrame->Iconize(false);
  shownFrame->Raise();
  LogEvent("prompt", "similar");
}

void RefreshSimilar() {
  if (shownFrame != nullptr) shownFrame->FilesChanged();
}

}  // namespace fotomill::desktop
