#include "desktop/windows/view/view_frame.h"

#include <wx/weakref.h>

#include <algorithm>
#include <cmath>

#include "batch/picture_failure.h"
#include "catalog/history/file_history.h"
#include "desktop/models/shell/event_log.h"
#include "desktop/models/shell/favorites.h"
#include "desktop/models/view/view_status.h"
#include "desktop/windows/edit/quick_menu.h"
#include "desktop/windows/files/file_actions.h"
#include "desktop/windows/history/use_recorder.h"
#include "desktop/windows/shell/browser_tabs.h"
#include "desktop/windows/shell/shell.h"
#include "desktop/windows/view/animation_bar.h"
#include "desktop/windows/view/canvas_backdrop.h"
#include "desktop/windows/view/overlay_bar.h"
#include "desktop/windows/view/screen_profile.h"
#include "desktop/windows/view/view_animation.h"
#include "desktop/windows/view/view_commands.h"
#include "desktop/windows/view/view_file_commands.h"
#include "desktop/windows/widgets/screen_reader.h"
#include "desktop/windows/widgets/wx_text.h"
#include "platform/clock.h"
#include "platform/files.h"
#include "platform/paths.h"
#include "settings/configuration.h"
#include "settings/settings.h"
#include "texts/texts.h"

namespace fotomill::desktop {

namespace {

constexpr uint64_t kAheadBytes = 768ull * 1024 * 1024;  // for decoded pictures
constexpr int kPointerMs = 2000;
constexpr int kNoteMs = 6000;

}  // namespace

ViewFrame::ViewFrame(Shell& shell, const std::vector<std::string>& list, const std::string& file)
    : wxFrame(&shell.Window(), wxID_ANY, Label("View"), wxDefaultPosition, wxDefaultSize,
              wxDEFAULT_FRAME_STYLE, "FotomillProfessionalView"),
      shell_(shell),
      list_(list, file),
      pointerTimer_(this),
      slideshow_({.busy = [this] { return animation_->MustFinish(); },
                  .show = [this](size_t place) { GoTo(place); }}) {
  SetSize(shell.Window().GetSize());
  const WindowCalls::Post post = calls_.Poster();
  loader_ = std::make_unique<ViewLoader>(
      kAheadBytes, [this, post] { post([this] { PictureCame(); }); },
      [this, post](const std::string& path, int percent) {
        post([this, path, percent] { ShowProgress(path, percent); });
      });
  BuildCanvas();
  bar_ = new AnimationBar(this,
                          {.toggle = [this] { PlayOrNext(), canvas_->SetFocus(); },
                           .step = [this](int frames) { StepFrame(frames), canvas_->SetFocus(); }});
  animation_ = std::make_unique<ViewAnimation>(
      *canvas_, *bar_,
      ViewAnimation::Events{
          .changed = [this] { ViewChanged(); },
          .dressed = [this](const ViewPicturePointer& picture) { return Turned(picture); }});
  auto* column = new wxBoxSizer(wxVERTICAL);
  column->Add(canvas_, wxSizerFlags(1).Expand());
  column->Add(bar_, wxSizerFlags().Expand());
  SetSizer(column);
  BuildMenus();
  CreateStatusBar();
  canvas_->SetFocus();
  Bind(
      wxEVT_TIMER,
      [this](wxTimerEvent&) {
        if (IsFullScreen() && !overlayBar_->Holds()) canvas_->SetCursor(wxCursor(wxCURSOR_BLANK));
      },
      pointerTimer_.GetId());
  noteTimer_.Bind(wxEVT_TIMER, [this](wxTimerEvent&) { canvas_->SetNote({}); });
  Bind(wxEVT_MOVE, [this](wxMoveEvent& event) { Moved(), event.Skip(); });
  if (settings.MaximizeViewWindow != 0) Maximize();
  ShowPlace();
}

void ViewFrame::BuildMenus() {
  SetMenuBar(NewCommandBar(ViewCommands(), ViewMenus(), *this));
  HandleQuickActions(
      *this, shell_, [] { return true; }, [this] { return std::vector{File()}; });
}

void ViewFrame::BuildCanvas() {
  canvas_ = new ViewCanvas(this, {.resized = [this] { Resized(); },
                                  .changed = [this] { ViewChanged(); },
                                  .painted = [this] { LogPaint(); },
                                  .decorate =
                                      [this](wxDC& dc) {
                                        if (overlayBar_ != nullptr) overlayBar_->Draw(dc);
                                      }});
  canvas_->Bind(wxEVT_KEY_DOWN, &ViewFrame::OnKey, this);
  canvas_->Bind(wxEVT_RIGHT_DOWN, [this](wxMouseEvent& event) { ShowMenu(event.GetPosition()); });
  canvas_->Bind(wxEVT_MOTION, [this](wxMouseEvent& event) {
    HidePointerLater();
    event.Skip();
  });
  // Its handlers of mouse events come before those of the canvas.
  overlayBar_ = std::make_unique<OverlayBar>(
      *canvas_, shell_.Thumbnails(),
      OverlayBar::Events{
          .run = [this](const OverlayBar::Command& command) { command.run(*this); },
          .show = [this](size_t place) { GoTo(place); }});
}

// Another screen may have another color profile.
void ViewFrame::Moved() {
  const size_t screen = ScreenOf(*this);
  if (std::exchange(screen_, screen) == screen) return;
  LogEvent("view-screen", std::to_string(screen));
  if (canvas_ != nullptr && !AskForPicture()) ViewChanged();
}

ViewFrame::~ViewFrame() {
  animation_.reset();  // before the windows that it uses
  DestroyInBackground(std::move(loader_));
  overlayBar_.reset();
  if (shown_) shell_.Window().CallAfter(shown_);
}

// --- choosing pictures ---

void ViewFrame::ShowList(const std::vector<std::string>& list, const std::string& file) {
  slideshow_.Stop();
  list_ = ViewList(list, file);
  folder_.clear();
  StartAfresh();
  canvas_->SetFocus();
}

ViewRequest ViewFrame::RequestOf(size_t place) const {
  const wxSize size = canvas_->DeviceSize();
  ViewRequest request{list_.Files()[place], place == list_.Place() ? page_ : 0, size.x, size.y};
  request.look.screen = screen_;
  return request;
}

void ViewFrame::Step(int files) { GoTo(list_.PlaceAfter(files)); }

void ViewFrame::GoTo(size_t place) {
  if (place >= list_.Count() ||
      (place == list_.Place() && page_ == 0 && canvas_->Picture() != nullptr))
    return;
  list_.GoTo(place);
  StartAfresh();
}

void ViewFrame::FollowRename(const std::string& from, const std::string& to) {
  if (LiesIn(folder_, from)) folder_ = RenamedPath(folder_, from, to);
  if (list_.FollowRename(from, to)) StartAfresh();
}

void ViewFrame::StepPage(int pages) {
  if (animation_->Active()) return animation_->Step(pages);
  const ViewPicturePointer& shown = canvas_->Picture();
  if (shown == nullptr || shown->picture == nullptr) return;
  const int32_t page = page_ + pages;
  if (page < 0 || page >= shown->picture->pageCount) return;
  page_ = page;
  turn_ = Orientation::Upright;
  note_.clear();
  ShowPlace();
}

void ViewFrame::StartAfresh() {
  tagged_ = false;
  page_ = 0;
  note_.clear();
  turn_ = Orientation::Upright;
  canvas_->StartAfresh();
  ShowPlace();
}

void ViewFrame::StepFrame(int frames) {
  if (animation_->Active()) animation_->Step(frames);
}

void ViewFrame::PlayOrNext() {
  if (!animation_->Active()) return Step(1);
  animation_->Toggle();
}

void ViewFrame::ShowPlace() {
  if (AskForPicture()) return;
  ShowStandIn();
  ViewChanged();
}

// Whether the picture was already loaded, and is shown.
bool ViewFrame::AskForPicture() {
  animation_->End();
  loadedPercent_ = 0;
  keyTime_ = platform::MonotonicSeconds();
  WantPictures();
  canvas_->SetNote({});
  const ViewPicturePointer ready = loader_->Find(RequestOf(list_.Place()));
  if (ready == nullptr) return false;
  ShowPicture(ready);
  ReloadIfChanged();
  return true;
}

// Whether the file of the picture shown has changed is asked in the background.
void ViewFrame::ReloadIfChanged() {
  if (loaded_ == nullptr || saving_) return;
  changes_.Ask<bool>(
      [picture = loaded_] {
        return picture->HasChanged() && platform::IsRegularFile(picture->request.path);
      },
      [this, picture = loaded_](bool changed) {
        if (!changed || saving_ || loaded_ != picture) return;
        loader_->Forget(list_.File());
        loaded_.reset();
        const bool samePixels = std::exchange(tagged_, false) && page_ == 0;
        if (!samePixels || turn_ != Orientation::Upright) return StartAfresh();
        if (!AskForPicture()) ViewChanged();  // what is shown stays until then
      });
}

// Shows the browser's thumbnail, if any, until the picture is loaded.
void ViewFrame::ShowStandIn() {
  const ThumbnailPointer thumbnail = shell_.Thumbnails().FindAny(list_.File());
  PackedImage image;
  if (thumbnail == nullptr || thumbnail->pixels.Empty() ||
      ToPacked(thumbnail->pixels, image) != Status::Ok)
    return;
  constexpr int32_t kUnknown = 16;  // assumed scale of the picture, if its size is unknown
  const bool known = thumbnail->width > 0;
  int32_t width = known ? thumbnail->width : image.Width() * kUnknown;
  int32_t height = known ? thumbnail->height : image.Height() * kUnknown;
  // the thumbnail is upright
  if ((width > height) != (image.Width() > image.Height())) std::swap(width, height);
  canvas_->ShowStandIn(std::move(image), width, height);
}

void ViewFrame::WantPictures() {
  if (loader_ == nullptr || canvas_ == nullptr) return;
  std::vector<ViewRequest> requests;
  for (const size_t place : list_.PlacesToLoad(slideshow_.Upcoming()))
    requests.push_back(RequestOf(place));
  loader_->Want(std::move(requests));
}

void ViewFrame::PictureCame() {
  if (IsCurrent(loaded_)) return;
  if (const ViewPicturePointer ready = loader_->Find(RequestOf(list_.Place()))) ShowPicture(ready);
}

void ViewFrame::ShowProgress(const std::string& path, int percent) {
  if (settings.ShowProgressWhenViewing == 0 || path != list_.File() || IsCurrent(loaded_)) return;
  loadedPercent_ = percent;
  LogEvent("view-progress", std::to_string(percent) + " " + path);
  ViewChanged();
}

void ViewFrame::ShowPicture(ViewPicturePointer picture) {
  LogEvent("view",
           "place=" + PlaceText() + " page=" + std::to_string(page_ + 1) +
               " status=" + std::to_string(StatusNumber(picture->status)) + " ms=" +
               std::to_string(std::lround((platform::MonotonicSeconds() - keyTime_) * 1000)) +
               " file=" + list_.File());
  if (picture->picture != nullptr) shell_.Uses().Note({FileUse{list_.File(), FileFunction::View}});
  loaded_ = std::move(picture);
  ShowNote();
  ShowTurned();
  animation_->Begin(loaded_);
  slideshow_.ShownAt(list_.Place(), list_.Count());
  if (shown_) shell_.Window().CallAfter(std::exchange(shown_, nullptr));
}

// What is wrong with the file, for a while.
void ViewFrame::ShowNote() {
  std::string note;
  if (loaded_->picture != nullptr) {
    note = MisnamedRemark(*loaded_->picture);
    if (loaded_->picture->shortfall != Status::Ok)
      note = Tr("The file is damaged or incomplete; part of the picture is missing.");
  }
  if (!note.empty()) LogEvent("view-note", note);
  canvas_->SetNote(Shown(note));
  noteTimer_.StartOnce(kNoteMs);
}

void ViewFrame::WhenShown(std::function<void()> shown) {
  // small pictures may be loaded already
  if (IsCurrent(loaded_)) return shell_.Window().CallAfter(shown);
  shown_ = std::move(shown);
}

bool ViewFrame::UseList(const std::vector<std::string>& list) {
  if (list == list_.Files()) return true;
  if (folder_.empty() && !list_.Replace(list)) return false;
  if (!folder_.empty()) list_.Follow(list);
  slideshow_.ListChanged(list_.Place(), list_.Count());
  WantPictures();
  ViewChanged();
  LogEvent("view-list", PlaceText());
  return true;
}

void ViewFrame::Resized() {
  if (animation_ == nullptr) return;  // during construction
  WantPictures();
  animation_->Resized();
}

void ViewFrame::ShowTurned() {
  if (animation_->Active()) return animation_->ShowAgain();
  ViewPicturePointer turned = Turned(loaded_);
  if (turned == nullptr) return wxBell();
  canvas_->Show(std::move(turned));
}

// A picture or frame prepared for display; null if out of memory.
ViewPicturePointer ViewFrame::Turned(const ViewPicturePointer& picture) const {
  const bool turns = turn_ != Orientation::Upright && picture->picture != nullptr;
  return turns ? TurnedView(*picture, turn_) : picture;
}

bool ViewFrame::IsCurrent(const ViewPicturePointer& picture) const {
  return picture != nullptr && picture->request.SamePicture(RequestOf(list_.Place()));
}

std::string ViewFrame::PlaceText() const {
  return std::to_string(list_.Place() + 1) + "/" + std::to_string(list_.Count());
}

// --- showing ---

// Logs each picture and zoom once, with the time since the request; and each frame of an animation.
void ViewFrame::LogPaint() {
  if (animation_->Active()) LogEvent("view-frame", animation_->StatusText());
  const std::string shown =
      std::to_string(std::lround(canvas_->Zoom() * 100)) + "% " + canvas_->Picture()->request.path;
  if (shown == painted_) return;
  painted_ = shown;
  LogEvent("view-painted",
           shown + " ms=" +
               std::to_string(std::lround((platform::MonotonicSeconds() - keyTime_) * 1000)));
}

std::string ViewFrame::StatusLine() const {
  const ViewPicturePointer& shown = canvas_->Picture();
  return ViewStatusText({.place = list_.Place(),
                         .count = list_.Count(),
                         .picture = IsCurrent(shown) ? shown.get() : nullptr,
                         .loadedPercent = loadedPercent_,
                         .zoom = canvas_->Zoom(),
                         .page = page_,
                         .turned = turn_ != Orientation::Upright,
                         .animation = animation_->Active() ? animation_->StatusText() : "",
                         .note = note_});
}

// File name, status bar text, camera facts.
std::vector<std::string> ViewFrame::OverlayLines() const {
  std::vector<std::string> lines = {std::string(platform::FileNameOf(list_.File())), StatusLine()};
  const ViewPicturePointer& shown = canvas_->Picture();
  if (IsCurrent(shown)) lines.insert(lines.end(), shown->photo.begin(), shown->photo.end());
  return lines;
}

void ViewFrame::ViewChanged() {
  if (canvas_ == nullptr || GetStatusBar() == nullptr) return;  // during construction
  const std::string line = StatusLine();
  const wxString name = Shown(platform::FileNameOf(list_.File()));
  const wxString title = turn_ == Orientation::Upright
                             ? Label("%1 - View", name)
                             : Label("%1 (rotated, not saved) - View", name);
  if (title != GetTitle()) SetTitle(title);
  SetStatusText(Shown(line));
  // Do not announce a number that changes many times per second.
  if (!animation_->Playing()) ReportToScreenReader(*canvas_, name, Shown(line));
  canvas_->SetOverlay(overlay_ ? OverlayLines() : std::vector<std::string>());
  overlayBar_->SetFiles(list_.Files(), list_.Place());
}

void ViewFrame::ToggleFullScreen() {
  ShowFullScreen(!IsFullScreen());
  canvas_->SetAround(IsFullScreen() ? static_cast<Color>(settings.ViewModeFullScreenBackground)
                                    : BackdropFor(*canvas_).around);
  animation_->HideBar(IsFullScreen());
  HidePointerLater();
}

void ViewFrame::HidePointerLater() {
  canvas_->SetCursor(wxNullCursor);
  if (IsFullScreen()) pointerTimer_.StartOnce(kPointerMs);
}

void ViewFrame::ToggleSlideshow() {
  if (slideshow_.Running()) return slideshow_.Stop();
  if (!IsFullScreen()) ToggleFullScreen();
  slideshow_.Start(list_.Place(), list_.Count());
  slideshow_.ShownAt(list_.Place(), list_.Count());
}

void ViewFrame::ChooseSlideshow() {
  slideshow_.Stop();
  if (slideshow_.Choose(*this)) ToggleSlideshow();
}

void ViewFrame::ToggleOverlay() {
  overlay_ = !overlay_;
  ViewChanged();
}

void ViewFrame::SettingSwitched() {
  (void)SaveConfiguration();
  LogEvent("view-look", "profiles=" + std::to_string(settings.ViewModeColorProfiles) +
                            " checkerboard=" + std::to_string(settings.ViewModeCheckerboard) +
                            " keepzoom=" + std::to_string(settings.ViewModeKeepZoom));
  if (!IsCurrent(canvas_->Picture()) && !AskForPicture()) ViewChanged();
}

void ViewFrame::Leave() {
  slideshow_.Stop();
  if (IsFullScreen()) return ToggleFullScreen();
  if (BrowserPage* browser = shell_.Tabs().Front()) browser->FocusPath(list_.File());
  Close();
}

void ViewFrame::DeleteFile() {
  const std::string path = list_.File();
  shell_.Files().TrashFromView(this, path, [self = wxWeakRef<ViewFrame>(this), path] {
    if (self) self->FileGone(path);
  });
}

void ViewFrame::FileGone(const std::string& path) {
  loader_->Forget(path);
  const std::string shown = list_.File();
  // The user or a slideshow may have advanced meanwhile.
  if (!list_.Contains(path)) return;
  if (list_.Count() == 1) {
    Close();
    return;
  }
  list_.Remove(path);
  if (list_.File() != shown) return StartAfresh();
  slideshow_.ShownAt(list_.Place(), list_.Count());
  ViewChanged();
}

// --- turning ---

void ViewFrame::Turn(Orientation turn) {
  if (saving_ || !IsCurrent(loaded_) || loaded_->picture == nullptr) return wxBell();
  turn_ = Composed(turn_, turn);
  note_.clear();
  LogEvent("view-turned", std::to_string(static_cast<int>(turn_)) + " " + list_.File());
  ShowTurned();
}

void ViewFrame::SaveTurned() {
  if (saving_ || turn_ == Orientation::Upright)
    return SetStatusText(Label("The picture is unchanged."));
  const std::string path = list_.File();
  const wxWeakRef<ViewFrame> self(this);
  saving_ =
      shell_.Files().SaveTurned(path, turn_, [self, path](bool done, const std::string& note) {
        if (!self) return;
        self->saving_ = false;
        if (done) self->FilesChanged();
        if (self->list_.File() == path) self->note_ = note;
        self->ViewChanged();
      });
  SetStatusText(saving_ ? Label("Saving...")
                        : Label("Please wait for the previous file operation."));
}

// --- tags ---

ViewPicturePointer ViewFrame::Loaded() const { return IsCurrent(loaded_) ? loaded_ : nullptr; }

void ViewFrame::TagFile(const std::string& path, const TagChanges& changes) {
  tagged_ = true;
  shell_.Files().Tag({path}, changes);
}

void ViewFrame::FilesChanged() { ReloadIfChanged(); }

void ViewFrame::Undo() {
  if (saving_) return wxBell();
  if (turn_ == Orientation::Upright || loaded_ == nullptr) return shell_.Files().Undo();
  turn_ = Orientation::Upright;
  ShowTurned();
}

void ViewFrame::Redo() { shell_.Files().Redo(); }

// --- keys ---

void ViewFrame::OnKey(wxKeyEvent& event) {
  const int key = event.GetKeyCode();
  if (canvas_->PanByKey(key)) return;
  if (key == WXK_LEFT || key == WXK_UP) return Step(-1);
  if (key == WXK_RIGHT || key == WXK_DOWN) return Step(1);
  if (event.ShiftDown() && key == 'S') return ChooseSlideshow();
  if (event.AltDown() && key == WXK_RETURN) return ShowInfoOf(*this);
  if (event.AltDown() || (event.ShiftDown() && key >= '0' && key <= '9')) return event.Skip();
  // Some letters with Ctrl have the same codes as other keys.
  constexpr int kLettersWithCtrl[] = {'C', 'S', 'Y', 'Z'};
  const bool letter = std::ranges::find(kLettersWithCtrl, key) != std::end(kLettersWithCtrl);
  const int typed = !event.ControlDown() ? key : letter ? key - 'A' + WXK_CONTROL_A : 0;
  if (const KeyCommand<ViewFrame>* command = CommandOfKey(ViewCommands(), typed))
    return command->run(*this);
  event.Skip();
}

void ViewFrame::ShowMenu(const wxPoint& place) {
  if (settings.RightClickMenuInView == 0) return;
  ShowCommandMenu(ViewCommands(), *this, *canvas_, place);
}

}  // namespace fotomill::desktop
