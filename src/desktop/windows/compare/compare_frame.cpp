#include "desktop/windows/compare/compare_frame.h"

#include <wx/panel.h>
#include <wx/settings.h>
#include <wx/sizer.h>
#include <wx/stattext.h>
#include <wx/weakref.h>

#include <algorithm>
#include <cmath>
#include <limits>

#include "catalog/history/file_history.h"
#include "desktop/models/shell/event_log.h"
#include "desktop/windows/files/file_actions.h"
#include "desktop/windows/history/use_recorder.h"
#include "desktop/windows/info/info_frame.h"
#include "desktop/windows/shell/browser_tabs.h"
#include "desktop/windows/shell/shell.h"
#include "desktop/windows/widgets/key_commands.h"
#include "desktop/windows/widgets/screen_reader.h"
#include "desktop/windows/widgets/wx_text.h"
#include "platform/files.h"
#include "platform/paths.h"
#include "settings/configuration.h"
#include "settings/settings.h"
#include "texts/texts.h"

namespace fotomill::desktop {

namespace {

// all pictures are visible, so none can be dropped
constexpr uint64_t kNoLimit = std::numeric_limits<uint64_t>::max();
constexpr int kAcross = 2;                                           // panes side by side
// around the pane with the focus
constexpr int kFrameWidth = 3;

template <int step>
void StepPane(CompareFrame& compare) {
  compare.StepPane(step);
}
bool AreJoined(const CompareFrame& compare) { return compare.Joined(); }
template <int32_t Settings::*setting>
constexpr auto Switch = SwitchSetting<CompareFrame, setting>;
template <int32_t Settings::*setting>
constexpr auto IsOn = SettingIsOn<CompareFrame, setting>;

// clang-format off
constexpr KeyCommand<CompareFrame> kCommands[] = {
    {TrLater("&Next pane"),        "Tab",       {WXK_TAB},                       StepPane<1>},
    {TrLater("&Previous pane"),    "Shift+Tab", {},                              StepPane<-1>},
    {TrLater("Lin&k zoom and position"), "J",      {'J'},                           Of<&CompareFrame::ToggleJoined>, AreJoined},
    {nullptr, nullptr, {}, nullptr},
    {TrLater("Zoom &in"),          "+",         {'+', '=', WXK_NUMPAD_ADD},      OfCanvas<&ViewCanvas::ZoomIn>},
    {TrLater("Zoom &out"),         "-",         {'-', WXK_NUMPAD_SUBTRACT},      OfCanvas<&ViewCanvas::ZoomOut>},
    {TrLater("Fit to &window"),    "Z",         {'Z', '0', WXK_NUMPAD0},            Zoom<ZoomMode::Fit>},
    {TrLater("&Actual size"),      "A",         {'A', '1', WXK_NUMPAD1},            OfCanvas<&ViewCanvas::ZoomActual>},
    {TrLater("Fit to wi&dth"),     "W",         {'W', '2', WXK_NUMPAD2},            Zoom<ZoomMode::FitWidth>},
    {TrLater("Fi&ll the window"),  "D",         {'D', '3', WXK_NUMPAD3},            Zoom<ZoomMode::Fill>},
    {nullptr, nullptr, {}, nullptr},
    {TrLater("Full &screen"),      "F11",       {WXK_F11, 'F'},                  Of<&CompareFrame::ToggleFullScreen>},
    {TrLater("Apply color pro&file"), "M",    {'M'},                           Switch<&Settings::ViewModeColorProfiles>, IsOn<&Settings::ViewModeColorProfiles>},
    {TrLater("Check&erboard behind transparency"), "B", {'B'},                   Switch<&Settings::ViewModeCheckerboard>, IsOn<&Settings::ViewModeCheckerboard>},
    {TrLater("&Get info..."),      "Alt+Enter", {},                              Of<&CompareFrame::ShowInfoWindow>},
    {nullptr, nullptr, {}, nullptr},
    {TrLater("Dele&te"),           "Del",       {WXK_DELETE},                    Of<&CompareFrame::DeleteFile>},
    {TrLater("&Close"),            "Esc",       {WXK_ESCAPE, WXK_RETURN, WXK_NUMPAD_ENTER}, Of<&CompareFrame::Leave>},
};
// clang-format on

std::span<const KeyCommand<CompareFrame>> Commands() { return kCommands; }

}  // namespace

CompareFrame::CompareFrame(Shell& shell, const std::vector<std::string>& files)
    : wxFrame(&shell.Window(), wxID_ANY, Label("Compare"), wxDefaultPosition, wxDefaultSize,
              wxDEFAULT_FRAME_STYLE, "FotomillProfessionalCompare"),
      shell_(shell) {
  SetSize(shell.Window().GetSize());
  for (const std::string& file : files) panes_.push_back(BuildPane(file));
  place_ = panes_.front().canvas->Place();
  loader_ = std::make_unique<ViewLoader>(
      kNoLimit, [this, post = calls_.Poster()] { post([this] { PicturesCame(); }); });
  CreateStatusBar();
  ArrangePanes();
  panes_.front().canvas->SetFocus();
  if (settings.MaximizeViewWindow != 0) Maximize();
  WantPictures();
}

CompareFrame::~CompareFrame() { DestroyInBackground(std::move(loader_)); }

CompareFrame::Pane CompareFrame::BuildPane(const std::string& path) {
  auto* panel = new wxPanel(this);
  Pane pane{path, panel, nullptr,
            new wxStaticText(panel, wxID_ANY, Shown(platform::FileNameOf(path)), wxDefaultPosition,
                             wxDefaultSize, wxST_ELLIPSIZE_MIDDLE)};
  // The events need their canvas, which does not exist yet.
  const auto self = std::make_shared<ViewCanvas*>(nullptr);
  pane.canvas = new ViewCanvas(panel, {.resized = [this] { WantPictures(); },
                                       .changed = [this, self] { ShowFacts(*self); },
                                       .painted = [] {},
                                       .placed = [this, self] { Placed(*self); }});
  ViewCanvas* const canvas = *self = pane.canvas;
  canvas->Bind(wxEVT_KEY_DOWN, &CompareFrame::OnKey, this);
  canvas->Bind(wxEVT_SET_FOCUS, [this, canvas](wxFocusEvent& event) {
    Focused(PaneOf(canvas));
    event.Skip();
  });
  canvas->Bind(wxEVT_RIGHT_DOWN, [this, canvas](wxMouseEvent& event) {
    canvas->SetFocus();
    if (settings.RightClickMenuInView != 0)
      ShowCommandMenu(Commands(), *this, *canvas, event.GetPosition());
  });
  auto* rows = new wxBoxSizer(wxVERTICAL);
  rows->Add(canvas, wxSizerFlags(1).Expand().Border(wxALL, FromDIP(kFrameWidth)));
  rows->Add(pane.caption,
            wxSizerFlags().Expand().Border(wxLEFT | wxRIGHT | wxBOTTOM, FromDIP(kFrameWidth)));
  panel->SetSizer(rows);
  return pane;
}

void CompareFrame::ArrangePanes() {
  const int count = static_cast<int>(panes_.size());
  SetSizer(nullptr);  // removes the panes from the old sizer
  auto* grid = new wxGridSizer(std::min(count, kAcross), FromDIP(wxSize(kFrameWidth, kFrameWidth)));
  for (const Pane& pane : panes_) grid->Add(pane.panel, wxSizerFlags(1).Expand());
  SetSizer(grid);
  Layout();
  SetTitle(
      LabelCount("Compare - %1 picture", "Compare - %1 pictures", static_cast<uint64_t>(count)));
}

size_t CompareFrame::PaneOf(const ViewCanvas* canvas) const {
  const auto found = std::ranges::find(panes_, canvas, &Pane::canvas);
  return static_cast<size_t>(found - panes_.begin());
}

// --- pictures ---

ViewRequest CompareFrame::RequestOf(const Pane& pane) const {
  const wxSize size = pane.canvas->DeviceSize();
  return {pane.path, 0, size.x, size.y};
}

void CompareFrame::WantPictures() {
  if (loader_ == nullptr) return;
  std::vector<ViewRequest> requests;
  for (const Pane& pane : panes_) requests.push_back(RequestOf(pane));
  loader_->Want(std::move(requests));
}

void CompareFrame::PicturesCame() {
  for (Pane& pane : panes_) {
    const ViewPicturePointer ready = loader_->Find(RequestOf(pane));
    if (ready != nullptr && ready != pane.canvas->Picture()) ShowPicture(pane, ready);
  }
}

void CompareFrame::FilesChanged() {
  std::vector<ViewPicturePointer> pictures;
  for (const Pane& pane : panes_) {
    if (pane.canvas->Picture() != nullptr) pictures.push_back(pane.canvas->Picture());
  }
  using Paths = std::vector<std::string>;
  changes_.Ask<Paths>(
      [pictures] {
        Paths changed;
        for (const ViewPicturePointer& picture : pictures) {
          const std::string& path = picture->request.path;
          if (picture->HasChanged() && platform::IsRegularFile(path)) changed.push_back(path);
        }
        return changed;
      },
      [this](const Paths& changed) {
        for (const std::string& path : changed) loader_->Forget(path);
        WantPictures();
      });
}

void CompareFrame::ShowPicture(Pane& pane, ViewPicturePointer picture) {
  LogEvent("compare",
           "pane=" + std::to_string(PaneOf(pane.canvas) + 1) + "/" + std::to_string(panes_.size()) +
               " status=" + std::to_string(StatusNumber(picture->status)) + " file=" + pane.path);
  if (picture->picture != nullptr) shell_.Uses().Note({FileUse{pane.path, FileFunction::View}});
  pane.canvas->Show(std::move(picture));
  if (joined_) pane.canvas->SetPlace(place_);
}

// --- panes ---

void CompareFrame::Placed(const ViewCanvas* canvas) {
  if (joined_) {
    place_ = canvas->Place();
    for (const Pane& pane : panes_) {
      if (pane.canvas != canvas) pane.canvas->SetPlace(place_);
    }
  }
  std::string zooms;
  for (const Pane& pane : panes_)
    zooms += " " + std::to_string(std::lround(pane.canvas->Zoom() * 100)) + "%";
  LogEvent("compare-zoom", "joined=" + std::to_string(joined_ ? 1 : 0) + zooms);
}

void CompareFrame::Focused(size_t pane) {
  if (pane >= panes_.size()) return;  // during construction
  focus_ = pane;
  for (const Pane& each : panes_) {
    const bool own = &each == &panes_[focus_];
    each.panel->SetBackgroundColour(
        wxSystemSettings::GetColour(own ? wxSYS_COLOUR_HIGHLIGHT : wxSYS_COLOUR_FRAMEBK));
    each.caption->SetForegroundColour(
        wxSystemSettings::GetColour(own ? wxSYS_COLOUR_HIGHLIGHTTEXT : wxSYS_COLOUR_WINDOWTEXT));
    each.caption->SetFont(own ? GetFont().Bold() : GetFont());
    each.panel->Refresh();
  }
  SetStatusText(joined_
                    ? Label("%1 of %2, zoomed and moved together", focus_ + 1, panes_.size())
                    : Label("%1 of %2, zoomed and moved separately", focus_ + 1, panes_.size()));
  LogEvent("compare-focus", std::to_string(focus_ + 1) + "/" + std::to_string(panes_.size()));
}

void CompareFrame::ShowFacts(const ViewCanvas* canvas) {
  const size_t place = PaneOf(canvas);
  if (place >= panes_.size()) return;
  const Pane& pane = panes_[place];
  const ViewPicturePointer& shown = canvas->Picture();
  const std::string facts = shown == nullptr ? std::string(Tr("loading..."))
                            : shown->picture == nullptr
                                ? shown->problem
                                : SizeAndZoom(*shown->picture, canvas->Zoom());
  const wxString name = Shown(platform::FileNameOf(pane.path));
  pane.caption->SetLabel(name + "   " + Shown(facts));
  ReportToScreenReader(*pane.canvas, name, Shown(facts));
}

// --- commands ---

void CompareFrame::ToggleJoined() {
  joined_ = !joined_;
  Focused(focus_);
  Placed(&Canvas());
}

void CompareFrame::StepPane(int panes) {
  const int count = static_cast<int>(panes_.size());
  panes_[static_cast<size_t>((static_cast<int>(focus_) + panes + count) % count)]
      .canvas->SetFocus();
}

void CompareFrame::ToggleFullScreen() { ShowFullScreen(!IsFullScreen()); }

void CompareFrame::SettingSwitched() {
  (void)SaveConfiguration();
  WantPictures();
  PicturesCame();
}

void CompareFrame::ShowInfoWindow() {
  std::vector<std::string> paths;
  for (const Pane& pane : panes_) paths.push_back(pane.path);
  (new InfoFrame(shell_, this, std::move(paths)))->Show();
}

void CompareFrame::DeleteFile() {
  const std::string path = panes_[focus_].path;
  shell_.Files().TrashFromView(this, path, [self = wxWeakRef<CompareFrame>(this), path] {
    if (self) self->FileGone(path);
  });
}

void CompareFrame::FileGone(const std::string& path) {
  const auto found = std::ranges::find(panes_, path, &Pane::path);
  if (found == panes_.end()) return;
  const Pane gone = *found;
  loader_->Forget(path);
  panes_.erase(found);
  gone.panel->Hide();
  // May be called from one of its events.
  CallAfter([panel = gone.panel] { panel->Destroy(); });
  if (panes_.empty()) {
    Close();
    return;
  }
  focus_ = std::min(focus_, panes_.size() - 1);
  ArrangePanes();
  Canvas().SetFocus();
  WantPictures();
}

void CompareFrame::Leave() {
  if (IsFullScreen()) return ToggleFullScreen();
  Close();
}

void CompareFrame::OnKey(wxKeyEvent& event) {
  const int key = event.GetKeyCode();
  if (key == WXK_TAB && event.ShiftDown()) return StepPane(-1);
  if (Canvas().PanByKey(key)) return;
  if (event.AltDown() && key == WXK_RETURN) return ShowInfoWindow();
  if (event.AltDown() || event.ControlDown()) return event.Skip();
  if (const KeyCommand<CompareFrame>* command = CommandOfKey(Commands(), key))
    return command->run(*this);
  event.Skip();
}

void CompareSelection(Shell& shell) {
  std::vector<std::string> files = shell.Tabs().SelectedFiles();
  if (!CompareFrame::CanShow(files.size()))
    return shell.Report(Tr("Select two to four files to compare."));
  (new CompareFrame(shell, files))->Show();
}

}  // namespace fotomill::desktop
