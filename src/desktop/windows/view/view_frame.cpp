#include "desktop/windows/view/view_frame.h"

#include <wx/clipbrd.h>
#include <wx/textdlg.h>
#include <wx/weakref.h>

#include <algorithm>
#include <cmath>

#include "batch/picture_failure.h"
#include "catalog/history/file_history.h"
#include "core/text.h"
#include "desktop/models/browser/item_tags.h"
#include "desktop/models/drawing/rgb_image.h"
#include "desktop/models/shell/event_log.h"
#include "desktop/windows/edit/crop_frame.h"
#include "desktop/windows/edit/edit_frame.h"
#include "desktop/windows/files/file_actions.h"
#include "desktop/windows/history/use_recorder.h"
#include "desktop/windows/info/info_frame.h"
#include "desktop/windows/metadata/exif_edit_frame.h"
#include "desktop/windows/shell/browser_tabs.h"
#include "desktop/windows/shell/shell.h"
#include "desktop/windows/view/animation_bar.h"
#include "desktop/windows/view/overlay_bar.h"
#include "desktop/windows/view/view_animation.h"
#include "desktop/windows/view/view_commands.h"
#include "desktop/windows/widgets/bitmaps.h"
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
      pointerTimer_(this),
      slideshow_({.busy = [this] { return animation_->MustFinish(); },
                  .show = [this](size_t place) { GoTo(place); }}) {
  TakeList(list, file);
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
  if (settings.MaximizeViewWindow != 0) Maximize();
  ShowPlace();
}

void ViewFrame::BuildMenus() { SetMenuBar(NewCommandBar(ViewCommands(), ViewMenus(), *this)); }

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

ViewFrame::~ViewFrame() {
  animation_.reset();  // before the windows that it uses
  DestroyInBackground(std::move(loader_));
  overlayBar_.reset();
  if (shown_) shell_.Window().CallAfter(shown_);
}

// --- choosing pictures ---

void ViewFrame::TakeList(const std::vector<std::string>& list, const std::string& file) {
  list_ = list;
  place_ = static_cast<size_t>(std::ranges::find(list_, file) - list_.begin());
  if (place_ < list_.size()) return;
  list_ = {file};
  place_ = 0;
}

void ViewFrame::ShowList(const std::vector<std::string>& list, const std::string& file) {
  slideshow_.Stop();
  TakeList(list, file);
  StartAfresh();
  canvas_->SetFocus();
}

ViewRequest ViewFrame::RequestOf(size_t place) const {
  const wxSize size = canvas_->DeviceSize();
  return {list_[place], place == place_ ? page_ : 0, size.x, size.y};
}

void ViewFrame::Step(int files) {
  const int64_t count = static_cast<int64_t>(list_.size());
  const int64_t place = (static_cast<int64_t>(place_) + files % count + count) % count;
  GoTo(static_cast<size_t>(place));
}

void ViewFrame::GoTo(size_t place) {
  if (place >= list_.size() || (place == place_ && page_ == 0 && canvas_->Picture() != nullptr))
    return;
  place_ = place;
  StartAfresh();
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
  const ViewPicturePointer ready = loader_->Find(RequestOf(place_));
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
        loader_->Forget(list_[place_]);
        loaded_.reset();
        const bool samePixels = std::exchange(tagged_, false) && page_ == 0;
        if (!samePixels || turn_ != Orientation::Upright) return StartAfresh();
        if (!AskForPicture()) ViewChanged();  // what is shown stays until then
      });
}

// Shows the browser's thumbnail, if any, until the picture is loaded.
void ViewFrame::ShowStandIn() {
  const ThumbnailPointer thumbnail = shell_.Thumbnails().FindAny(list_[place_]);
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

// Requests this picture, then the slideshow's next one, then two in each direction.
void ViewFrame::WantPictures() {
  if (loader_ == nullptr || canvas_ == nullptr) return;
  std::vector<ViewRequest> requests;
  const auto want = [&](size_t place) {
    ViewRequest request = RequestOf(place);
    const auto same = [&](const ViewRequest& other) { return other.SamePicture(request); };
    if (std::none_of(requests.begin(), requests.end(), same))
      requests.push_back(std::move(request));
  };
  want(place_);
  if (const auto upcoming = slideshow_.Upcoming(); upcoming && *upcoming < list_.size())
    want(*upcoming);
  const int64_t count = static_cast<int64_t>(list_.size());
  for (const int64_t step : {1, -1, 2, -2}) {
    want(static_cast<size_t>(((static_cast<int64_t>(place_) + step) % count + count) % count));
  }
  loader_->Want(std::move(requests));
}

void ViewFrame::PictureCame() {
  if (IsCurrent(loaded_)) return;
  if (const ViewPicturePointer ready = loader_->Find(RequestOf(place_))) ShowPicture(ready);
}

void ViewFrame::ShowProgress(const std::string& path, int percent) {
  if (settings.ShowProgressWhenViewing == 0 || path != list_[place_] || IsCurrent(loaded_)) return;
  loadedPercent_ = percent;
  LogEvent("view-progress", std::to_string(percent) + " " + path);
  ViewChanged();
}

void ViewFrame::ShowPicture(ViewPicturePointer picture) {
  LogEvent("view", "place=" + std::to_string(place_ + 1) + "/" + std::to_string(list_.size()) +
                       " page=" + std::to_string(page_ + 1) + " status=" + std::to_string(StatusNumber(picture->status)) +
                       " ms=" + std::to_string(std::lround((platform::MonotonicSeconds() - keyTime_) * 1000)) +
                       " file=" + list_[place_]);
  if (picture->picture != nullptr) shell_.Uses().Note({FileUse{list_[place_], FileFunction::View}});
  loaded_ = std::move(picture);
  ShowNote();
  ShowTurned();
  animation_->Begin(loaded_);
  slideshow_.ShownAt(place_, list_.size());
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
  const auto found = std::ranges::find(list, list_[place_]);
  if (found == list.end()) return false;
  place_ = static_cast<size_t>(found - list.begin());
  list_ = list;
  WantPictures();
  ViewChanged();
  LogEvent("view-list", std::to_string(place_ + 1) + "/" + std::to_string(list_.size()));
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
  return picture != nullptr && picture->request.SamePicture(RequestOf(place_));
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
  std::string line = Tr("%1 of %2", place_ + 1, ThousandsText(list_.size()));
  const ViewPicturePointer& shown = canvas_->Picture();
  if (!IsCurrent(shown))
    return line + ", " +
           (loadedPercent_ > 0 ? Tr("loading, %1%...", loadedPercent_) : Tr("loading..."));
  if (shown->picture == nullptr) return line + ", " + shown->problem;
  const PictureRecord& picture = *shown->picture;
  line += ", " + SizeAndZoom(picture, canvas_->Zoom());
  if (turn_ != Orientation::Upright) line += std::string(", ") + Tr("rotated, not saved");
  if (animation_->Active()) {
    line += ", " + animation_->StatusText();
  } else if (picture.pageCount > 1) {
    line += ", " + Tr("page %1 of %2", page_ + 1, picture.pageCount);
  }
  if (const std::string tags = TagText(shown->tags.rating, shown->tags.label);
      !tags.empty())
    line += ", " + tags;
  for (const std::string& note : {note_, MisnamedRemark(picture)}) {
    if (!note.empty()) line += (line.ends_with('.') ? " " : ". ") + note;
  }
  return line;
}

// File name, status bar text, camera facts.
std::vector<std::string> ViewFrame::OverlayLines() const {
  std::vector<std::string> lines = {std::string(platform::FileNameOf(list_[place_])), StatusLine()};
  const ViewPicturePointer& shown = canvas_->Picture();
  if (IsCurrent(shown)) lines.insert(lines.end(), shown->photo.begin(), shown->photo.end());
  return lines;
}

void ViewFrame::ViewChanged() {
  if (canvas_ == nullptr || GetStatusBar() == nullptr) return;  // during construction
  const std::string line = StatusLine();
  const wxString name = Shown(platform::FileNameOf(list_[place_]));
  const wxString title = turn_ == Orientation::Upright
                             ? Label("%1 - View", name)
                             : Label("%1 (rotated, not saved) - View", name);
  if (title != GetTitle()) SetTitle(title);
  SetStatusText(Shown(line));
  // Do not announce a number that changes many times per second.
  if (!animation_->Playing()) ReportToScreenReader(*canvas_, name, Shown(line));
  canvas_->SetOverlay(overlay_ ? OverlayLines() : std::vector<std::string>());
  overlayBar_->SetFiles(list_, place_);
}

void ViewFrame::ToggleFullScreen() {
  ShowFullScreen(!IsFullScreen());
  canvas_->SetAround(static_cast<Color>(IsFullScreen() ? settings.ViewModeFullScreenBackground
                                                       : settings.ViewModeBackground));
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
  slideshow_.Start(place_, list_.size());
  slideshow_.ShownAt(place_, list_.size());
}

void ViewFrame::ChooseSlideshow() {
  slideshow_.Stop();
  if (slideshow_.Choose(*this)) ToggleSlideshow();
}

void ViewFrame::ShowInfoWindow() { (new InfoFrame(shell_, this, {list_[place_]}))->Show(); }

void ViewFrame::EditPicture() { (new EditFrame(shell_, {list_[place_]}, nullptr))->Show(); }

void ViewFrame::CropPicture() { (new CropFrame(shell_, {list_[place_]}))->Show(); }

void ViewFrame::EditExif() { (new ExifEditFrame(shell_, this, {list_[place_]}))->Show(); }

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
  if (BrowserPage* browser = shell_.Tabs().Front()) browser->FocusPath(list_[place_]);
  Close();
}

void ViewFrame::DeleteFile() {
  const std::string path = list_[place_];
  shell_.Files().TrashFromView(this, path, [self = wxWeakRef<ViewFrame>(this), path] {
    if (self) self->FileGone(path);
  });
}

void ViewFrame::FileGone(const std::string& path) {
  loader_->Forget(path);
  // The user or a slideshow may have advanced meanwhile.
  const auto gone = std::ranges::find(list_, path);
  if (gone == list_.end()) return;
  const auto place = static_cast<size_t>(gone - list_.begin());
  list_.erase(gone);
  if (place != place_) {
    if (place < place_) --place_;
    slideshow_.ShownAt(place_, list_.size());
    return ViewChanged();
  }
  if (list_.empty()) {
    Close();
    return;
  }
  place_ = std::min(place_, list_.size() - 1);
  StartAfresh();
}

// --- turning ---

void ViewFrame::Turn(Orientation turn) {
  if (saving_ || !IsCurrent(loaded_) || loaded_->picture == nullptr) return wxBell();
  turn_ = Composed(turn_, turn);
  note_.clear();
  LogEvent("view-turned", std::to_string(static_cast<int>(turn_)) + " " + list_[place_]);
  ShowTurned();
}

void ViewFrame::SaveTurned() {
  if (saving_ || turn_ == Orientation::Upright)
    return SetStatusText(Label("The picture is unchanged."));
  const std::string path = list_[place_];
  const wxWeakRef<ViewFrame> self(this);
  saving_ =
      shell_.Files().SaveTurned(path, turn_, [self, path](bool done, const std::string& note) {
        if (!self) return;
        self->saving_ = false;
        if (done) self->FilesChanged();
        if (self->list_[self->place_] == path) self->note_ = note;
        self->ViewChanged();
      });
  SetStatusText(saving_ ? Label("Saving...")
                        : Label("Please wait for the previous file operation."));
}

// --- tags ---

void ViewFrame::TagByKey(int key) {
  const bool known = IsCurrent(loaded_);
  const auto changes = ChangesOfKey(key, known ? loaded_->tags.label : std::string());
  if (!changes) return;
  tagged_ = true;
  shell_.Files().Tag({list_[place_]}, *changes);
}

void ViewFrame::Comment() {
  const std::string path = list_[place_];
  const wxString old = IsCurrent(loaded_) ? Shown(loaded_->tags.description) : wxString();
  wxTextEntryDialog dialog(this, Label("Comment for %1:", Shown(platform::FileNameOf(path))),
                           Label("Comment"), old, wxTextEntryDialogStyle | wxTE_MULTILINE);
  LogEvent("prompt", "comment");
  if (dialog.ShowModal() != wxID_OK) return;
  TagChanges changes;
  changes.description = Utf8(dialog.GetValue());
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

void ViewFrame::CopyPicture() {
  const ViewPicturePointer& shown = canvas_->Picture();
  if (shown == nullptr || shown->picture == nullptr) return;
  RgbImage pixels;
  if (PixelsForOthers(*shown, static_cast<Color>(settings.ViewModeBackground), pixels) !=
      Status::Ok)
    return wxBell();
  const wxClipboardLocker clipboard;
  if (!clipboard || !wxTheClipboard->SetData(new wxBitmapDataObject(BitmapOf(pixels))))
    return wxBell();
  shell_.Uses().NoteAll({shown->request.path}, FileFunction::CopyToClipboard);
  SetStatusText(Label("The picture was copied to the clipboard."));
}

// --- keys ---

void ViewFrame::OnKey(wxKeyEvent& event) {
  const int key = event.GetKeyCode();
  if (canvas_->PanByKey(key)) return;
  if (key == WXK_LEFT || key == WXK_UP) return Step(-1);
  if (key == WXK_RIGHT || key == WXK_DOWN) return Step(1);
  if (event.ShiftDown() && key == 'S') return ChooseSlideshow();
  if (event.AltDown() && key == WXK_RETURN) return ShowInfoWindow();
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
