#include "desktop/windows/edit/edit_frame.h"

#include <wx/button.h>
#include <wx/choice.h>
#include <wx/msgdlg.h>
#include <wx/panel.h>
#include <wx/sizer.h>
#include <wx/splitter.h>
#include <wx/stattext.h>

#include <algorithm>
#include <cmath>
#include <utility>

#include "desktop/models/shell/event_log.h"
#include "desktop/windows/edit/edit_commands.h"
#include "desktop/windows/edit/histogram_panel.h"
#include "desktop/windows/edit/operation_tree.h"
#include "desktop/windows/edit/parameter_panel.h"
#include "desktop/windows/edit/picture_strip.h"
#include "desktop/windows/edit/preset_button.h"
#include "desktop/windows/edit/step_box.h"
#include "desktop/windows/shell/browser_tabs.h"
#include "desktop/windows/shell/shell.h"
#include "desktop/windows/widgets/screen_reader.h"
#include "desktop/windows/widgets/wx_text.h"
#include "platform/paths.h"
#include "settings/settings.h"
#include "texts/texts.h"

namespace fotomill::desktop {

namespace {

constexpr int kLeastSide = 350, kMostSide = 460;  // widths of the side pane
constexpr int kOriginalKey = 'O';                 // shows the original while held

wxString TitleOf(const std::vector<std::string>& files) {
  if (files.size() == 1) return Label("Edit: %1", Shown(platform::FileNameOf(files.front())));
  return LabelCount("Edit: %1 picture", "Edit: %1 pictures", files.size());
}

// A third of the window, within limits.
int SideWidth(const wxWindow& frame) {
  return std::clamp(frame.GetSize().x / 3, frame.FromDIP(kLeastSide), frame.FromDIP(kMostSide));
}

wxStaticText* NewHeading(wxWindow* parent, const wxString& text) {
  auto* heading = new wxStaticText(parent, wxID_ANY, text);
  heading->SetFont(heading->GetFont().Bold());
  return heading;
}

}  // namespace

EditFrame::EditFrame(Shell& shell, const std::vector<std::string>& files, const Operation* first)
    : wxFrame(&shell.Window(), wxID_ANY, TitleOf(files), wxDefaultPosition, wxDefaultSize,
              wxDEFAULT_FRAME_STYLE, "FotomillProfessionalEdit"),
      shell_(shell),
      files_(files) {
  SetSize(shell.Window().GetSize());
  maker_ = std::make_unique<PreviewMaker>([this] { CallAfter([this] { PreviewsCame(); }); });
  if (first != nullptr) steps_ = StepList(memory_.Start(*first));
  auto* panel = new wxPanel(this);
  auto* column = new wxBoxSizer(wxVERTICAL);
  auto* splitter = new wxSplitterWindow(panel, wxID_ANY, wxDefaultPosition, wxDefaultSize,
                                        wxSP_LIVE_UPDATE | wxSP_NOBORDER);
  splitter->SetMinimumPaneSize(FromDIP(220));
  splitter->SplitVertically(BuildSide(splitter, first), BuildPreview(splitter), SideWidth(*this));
  column->Add(splitter, wxSizerFlags(1).Expand());
  column->Add(BuildButtons(panel), wxSizerFlags().Expand().Border(wxALL, FromDIP(8)));
  panel->SetSizer(column);
  CreateStatusBar();
  SetMenuBar(NewEditMenu(*this));
  BindKeys();
  if (settings.MaximizeViewWindow != 0) Maximize();
  Bind(wxEVT_CLOSE_WINDOW, &EditFrame::OnClose, this);
  ShowPicture(0);
  StepsChanged();
  (first != nullptr ? static_cast<wxWindow*>(values_) : operations_)->SetFocus();
}

EditFrame::~EditFrame() { maker_.reset(); }  // its threads call back into this window

// --- building ---

wxWindow* EditFrame::BuildSide(wxWindow* parent, const Operation* first) {
  auto* panel = new wxPanel(parent);
  const int gap = FromDIP(8);
  auto* split = new wxSplitterWindow(panel, wxID_ANY, wxDefaultPosition, wxDefaultSize,
                                     wxSP_LIVE_UPDATE | wxSP_NOBORDER);
  auto* lower = new wxPanel(split);
  auto* rows = new wxBoxSizer(wxVERTICAL);
  rows->Add(NewHeading(lower, Label("Steps")));
  stepBox_ = new StepBox(lower, steps_, [this] { StepsChanged(); });
  stepBox_->SetMinSize(wxSize(-1, FromDIP(84)));
  rows->Add(stepBox_, wxSizerFlags(2).Expand().Border(wxTOP, gap / 2));
  rows->Add(BuildStepButtons(lower), wxSizerFlags().Expand().Border(wxTOP, gap / 2));
  auto* title = new wxBoxSizer(wxHORIZONTAL);
  valuesTitle_ = NewHeading(lower, "");
  title->Add(valuesTitle_, wxSizerFlags(1).CenterVertical());
  presets_ = new PresetButton(lower, memory_, [this](Step step) {
    steps_.SetCurrent(std::move(step));
    StepsChanged();
  });
  title->Add(presets_, wxSizerFlags().CenterVertical());
  rows->Add(title, wxSizerFlags().Expand().Border(wxTOP, gap));
  values_ = new ParameterPanel(
      lower, {.changed = [this](const char* parameter,
                                const std::string& text) { return ChangeValue(parameter, text); },
              .ended = [this] { steps_.EndChange(); }});
  rows->Add(values_, wxSizerFlags(3).Expand().Border(wxTOP, gap / 2));
  histogram_ = new HistogramPanel(lower);
  rows->Add(histogram_, wxSizerFlags().Expand().Border(wxTOP, gap));
  lower->SetSizer(rows);
  split->SetMinimumPaneSize(FromDIP(100));
  split->SplitHorizontally(BuildOperations(split, first), lower, FromDIP(190));
  auto* column = new wxBoxSizer(wxVERTICAL);
  column->Add(split, wxSizerFlags(1).Expand().Border(wxLEFT | wxTOP | wxRIGHT, gap));
  panel->SetSizer(column);
  return panel;
}

wxWindow* EditFrame::BuildOperations(wxWindow* parent, const Operation* first) {
  auto* panel = new wxPanel(parent);
  auto* rows = new wxBoxSizer(wxVERTICAL);
  rows->Add(NewHeading(panel, Label("Operations")));
  operations_ = new OperationTree(panel, first, [this] { AddChosen(); });
  rows->Add(operations_, wxSizerFlags(1).Expand().Border(wxTOP, FromDIP(4)));
  auto* add = new wxButton(panel, wxID_ANY, Label("&Add step"));
  add->Bind(wxEVT_BUTTON, [this](wxCommandEvent&) { AddChosen(); });
  rows->Add(add, wxSizerFlags().Border(wxTOP | wxBOTTOM, FromDIP(4)));
  panel->SetSizer(rows);
  return panel;
}

wxSizer* EditFrame::BuildStepButtons(wxWindow* parent) {
  auto* row = new wxBoxSizer(wxHORIZONTAL);
  const auto add = [&](const char* label, std::function<void()> run) {
    auto* button = new wxButton(parent, wxID_ANY, Label(label));
    button->Bind(wxEVT_BUTTON, [run = std::move(run)](wxCommandEvent&) { run(); });
    row->Add(button, wxSizerFlags().Border(wxRIGHT, FromDIP(4)));
    return button;
  };
  up_ = add(TrLater("&Up"), [this] { MoveStep(-1); });
  down_ = add(TrLater("Do&wn"), [this] { MoveStep(1); });
  remove_ = add(TrLater("&Remove"), [this] { RemoveStep(); });
  return row;
}

wxWindow* EditFrame::BuildPreview(wxWindow* parent) {
  auto* panel = new wxPanel(parent);
  auto* rows = new wxBoxSizer(wxVERTICAL);
  rows->Add(BuildPreviewBar(panel), wxSizerFlags().Expand().Border(wxALL, FromDIP(6)));
  canvas_ = new PreviewCanvas(panel, [this] {
    ++viewNumber_;
    originalCame_ = false;
    RequestPreview();
  });
  rows->Add(canvas_, wxSizerFlags(1).Expand());
  if (files_.size() > 1) {
    strip_ = new PictureStrip(panel, files_, [this](size_t place) { ShowPicture(place); });
    rows->Add(strip_, wxSizerFlags().Expand());
  }
  panel->SetSizer(rows);
  return panel;
}

wxSizer* EditFrame::BuildPreviewBar(wxWindow* parent) {
  auto* bar = new wxBoxSizer(wxHORIZONTAL);
  const auto apart = wxSizerFlags().CenterVertical().Border(wxRIGHT, FromDIP(6));
  bar->Add(new wxStaticText(parent, wxID_ANY, Label("S&how:")), apart);
  mode_ = new wxChoice(parent, wxID_ANY);
  mode_->SetName(Label("Show"));
  for (const char* text : {TrLater("Result"), TrLater("Split"), TrLater("Side by side")})
    mode_->Append(Label(text));
  mode_->SetSelection(0);
  mode_->Bind(wxEVT_CHOICE, [this](wxCommandEvent&) {
    SetMode(static_cast<PreviewMode>(mode_->GetSelection()));
  });
  bar->Add(mode_, apart);
  auto* original = new wxButton(parent, wxID_ANY, Label("&Original"));
  original->SetToolTip(Label("Shows the original while held; also with the key O."));
  original->Bind(wxEVT_LEFT_DOWN, [this](wxMouseEvent& event) {
    canvas_->ShowOriginal(true);
    event.Skip();
  });
  original->Bind(wxEVT_LEFT_UP, [this](wxMouseEvent& event) {
    canvas_->ShowOriginal(false);
    event.Skip();
  });
  bar->Add(original, apart);
  bar->AddStretchSpacer();
  zoom_ = new wxStaticText(parent, wxID_ANY, "100%");
  bar->Add(zoom_, apart);
  auto* fit = new wxButton(parent, wxID_ANY, Label("Fi&t"));
  fit->Bind(wxEVT_BUTTON, [this](wxCommandEvent&) { canvas_->SetZoom(ZoomMode::Fit); });
  bar->Add(fit, apart);
  auto* actual = new wxButton(parent, wxID_ANY, "&100%");
  actual->Bind(wxEVT_BUTTON, [this](wxCommandEvent&) { canvas_->ZoomActual(); });
  bar->Add(actual, wxSizerFlags().CenterVertical());
  return bar;
}

wxSizer* EditFrame::BuildButtons(wxWindow* parent) {
  auto* row = new wxBoxSizer(wxHORIZONTAL);
  row->AddStretchSpacer();
  auto* close = new wxButton(parent, wxID_CLOSE);
  close->Bind(wxEVT_BUTTON, [this](wxCommandEvent&) { Close(); });
  change_ = new wxButton(parent, wxID_ANY,
                         LabelCount("Chan&ge %1 file", "Chan&ge %1 files", files_.size()));
  change_->SetToolTip(Label("Writes the result into the files themselves; can be undone."));
  change_->Bind(wxEVT_BUTTON, [this](wxCommandEvent&) { ChangeFiles(); });
  copies_ = new wxButton(parent, wxID_ANY,
                         LabelCount("&Save %1 copy...", "&Save %1 copies...", files_.size()));
  copies_->Bind(wxEVT_BUTTON, [this](wxCommandEvent&) { SaveCopies(); });
  for (wxButton* button : {close, change_, copies_})
    row->Add(button, wxSizerFlags().Border(wxLEFT, FromDIP(8)));
  return row;
}

void EditFrame::BindKeys() {
  Bind(wxEVT_CHAR_HOOK, &EditFrame::OnCharHook, this);
  canvas_->Bind(wxEVT_KEY_UP, [this](wxKeyEvent& event) {
    if (event.GetKeyCode() == kOriginalKey) canvas_->ShowOriginal(false);
    event.Skip();
  });
  canvas_->Bind(wxEVT_KILL_FOCUS, [this](wxFocusEvent& event) {
    canvas_->ShowOriginal(false);
    event.Skip();
  });
}

// --- steps ---

void EditFrame::AddChosen() {
  const Operation* const operation = operations_->TakeChosen();
  if (operation == nullptr) return;
  steps_.Add(memory_.Start(*operation));
  (void)memory_.KeepChosen(*operation);
  changed_ = true;
  StepsChanged();
}

void EditFrame::RemoveStep() { stepBox_->RemoveCurrent(); }
void EditFrame::MoveStep(int by) { stepBox_->MoveCurrent(by); }

void EditFrame::Undo() {
  if (!steps_.CanUndo()) return wxBell();
  steps_.Undo();
  StepsChanged();
}

void EditFrame::Redo() {
  if (!steps_.CanRedo()) return wxBell();
  steps_.Redo();
  StepsChanged();
}

RecordedText EditFrame::ChangeValue(const char* parameter, const std::string& text) {
  RecordedText wrong = steps_.Set(parameter, text);
  if (wrong.empty()) StepsChanged();
  return wrong;
}

void EditFrame::StepsChanged() {
  wxWindow* const focus = FindFocus();
  const bool inValues = focus != nullptr && values_->IsDescendant(focus);
  stepBox_->ShowSteps();
  // Controls of another operation are new; their parent keeps the focus in the window.
  if (values_->ShowStep(steps_.CurrentStep()) && inValues)
    (steps_.CurrentStep() == nullptr ? static_cast<wxWindow*>(stepBox_) : values_)->SetFocus();
  const Step* const step = steps_.CurrentStep();
  valuesTitle_->SetLabel(step == nullptr ? wxString() : Label(step->operation->label));
  valuesTitle_->SetToolTip(step == nullptr ? wxString() : Label(step->operation->help));
  presets_->SetStep(step);
  UpdateControls();
  std::string text = steps_.RecipeText();
  if (text == lastText_) return;
  lastText_ = std::move(text);
  std::string line = lastText_.substr(0, lastText_.size() - (lastText_.empty() ? 0 : 1));
  std::ranges::replace(line, '\n', ';');
  LogEvent("edit-steps", line);
  changed_ = steps_.CanUndo();
  ++stepsNumber_;
  RequestPreview();
}

// --- preview ---

void EditFrame::ShowPicture(size_t place) {
  place_ = place;
  canvas_->StartAfresh();
  histogram_->Clear();
  maker_->SetPicture(files_[place]);
  originalCame_ = false;
  ++viewNumber_;
  RequestPreview();
}

void EditFrame::StepPicture(int by) {
  const auto place = static_cast<size_t>(static_cast<std::ptrdiff_t>(place_) + by);
  if (strip_ != nullptr && place < files_.size()) strip_->Choose(place);
}

void EditFrame::SetMode(PreviewMode mode) {
  mode_->SetSelection(static_cast<int>(mode));
  canvas_->SetMode(mode);
  LogEvent("edit-mode", std::to_string(static_cast<int>(mode)));
}

void EditFrame::RequestPreview() {
  if (canvas_ == nullptr) return;  // not built yet
  const wxSize pane = canvas_->PaneSize();
  exactCame_ = false;
  maker_->Request({.steps = stepsNumber_,
                   .list = steps_.Applied(),
                   .place = canvas_->Place(),
                   .width = pane.x,
                   .height = pane.y,
                   .view = viewNumber_,
                   .original = canvas_->ShowsOriginal() && !originalCame_});
  UpdateControls();
}

void EditFrame::PreviewsCame() {
  for (const PreviewPointer& preview : maker_->Fetch()) {
    LogEvent("edit-preview", "exact=" + std::to_string(preview->exact) +
                                 " original=" + std::to_string(preview->original) +
                                 " status=" + std::to_string(StatusNumber(preview->status)) +
                                 " size=" + std::to_string(preview->whole.width) + "x" +
                                 std::to_string(preview->whole.height) +
                                 " ms=" + std::to_string(std::lround(preview->seconds * 1000)) +
                                 " steps=" + std::to_string(preview->steps));
    if (preview->status != Status::Ok) {
      canvas_->ShowProblem(Shown(preview->problem));
      SetStatusText(Shown(preview->problem));
      continue;
    }
    if (preview->view == viewNumber_ && preview->original && preview->exact) originalCame_ = true;
    if (!preview->original && preview->exact) exactCame_ = true;
    canvas_->Take(preview);
    const PreviewPointer& result = canvas_->Result();
    if (!preview->original && result == preview) histogram_->Show(preview->pixels.image);
    UpdateControls();
  }
}

std::string EditFrame::StatusLine() const {
  std::string line(platform::FileNameOf(files_[place_]));
  const PreviewPointer& result = canvas_->Result();
  if (result == nullptr) return line + ", " + Tr("loading...");
  line += ", " + Tr("%1 x %2 pixels", result->whole.width, result->whole.height);
  if (!exactCame_) line += std::string(", ") + Tr("preview...");
  return line;
}

void EditFrame::UpdateControls() {
  if (copies_ == nullptr || GetStatusBar() == nullptr) return;  // not built yet
  const bool any = HasSteps();
  copies_->Enable(any);
  change_->Enable(any);
  const size_t current = steps_.Current();
  remove_->Enable(current != StepList::kNone);
  up_->Enable(current != StepList::kNone && current > 0);
  down_->Enable(current != StepList::kNone && current + 1 < steps_.Steps().size());
  const wxString zoom = wxString::Format("%ld%%", std::lround(canvas_->Zoom() * 100));
  if (zoom_->GetLabel() != zoom) {
    zoom_->SetLabel(zoom);
    zoom_->GetContainingSizer()->Layout();
  }
  const wxString line = Shown(StatusLine());
  if (GetStatusBar()->GetStatusText() != line) SetStatusText(line);
  ReportToScreenReader(*canvas_, Label("Preview"), line);
}

// --- keys ---

void EditFrame::OnCharHook(wxKeyEvent& event) {
  const int key = event.GetKeyCode();
  const wxWindow* const focus = FindFocus();
  if (key == WXK_ESCAPE) {
    Close();
  } else if (event.ControlDown() && (key == WXK_PAGEUP || key == WXK_PAGEDOWN)) {
    StepPicture(key == WXK_PAGEUP ? -1 : 1);  // sliders use these keys as well
  } else if (event.AltDown() && (key == WXK_UP || key == WXK_DOWN)) {
    MoveStep(key == WXK_UP ? -1 : 1);
  } else if (key == kOriginalKey && !event.HasAnyModifiers() && focus == canvas_) {
    canvas_->ShowOriginal(true);
  } else if (key == WXK_TAB && focus == canvas_) {
    canvas_->Navigate(event.ShiftDown() ? wxNavigationKeyEvent::IsBackward
                                        : wxNavigationKeyEvent::IsForward);
  } else {
    event.Skip();
  }
}

void EditFrame::OnClose(wxCloseEvent& event) {
  if (changed_ && event.CanVeto()) {
    wxMessageDialog dialog(this, Label("Close without applying the steps?"), Label("Edit"),
                           wxOK | wxCANCEL | wxCANCEL_DEFAULT | wxICON_QUESTION);
    dialog.SetOKCancelLabels(Label("&Discard"), Label("&Keep editing"));
    LogEvent("prompt", "discard-steps");
    if (dialog.ShowModal() != wxID_OK) return event.Veto();
  }
  LogEvent("edit", "closed");
  event.Skip();
}

namespace {

void EditFiles(Shell& shell, const Operation* first) {
  const std::vector<std::string> files = shell.Tabs().SelectedFiles();
  if (!files.empty()) (new EditFrame(shell, files, first))->Show();
}

}  // namespace

void EditSelection(Shell& shell) { EditFiles(shell, nullptr); }

void EditSelectionWith(Shell& shell, const Operation& operation) { EditFiles(shell, &operation); }

void EditSelectionWith(Shell& shell, Family family) {
  EditSelectionWith(shell, OperationMemory().Chosen(family));
}

}  // namespace fotomill::desktop
