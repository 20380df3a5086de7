#include "desktop/windows/view_frame.h"

#include <wx/clipbrd.h>
#include <wx/dcclient.h>
#include <wx/menu.h>
#include <wx/msgdlg.h>
#include <wx/settings.h>

#include <algorithm>
#include <cmath>

#include "catalog/file_history.h"
#include "core/choice_lists.h"
#include "core/settings.h"
#include "core/text.h"
#include "desktop/event_log.h"
#include "desktop/windows/bitmaps.h"
#include "desktop/windows/file_actions.h"
#include "desktop/windows/info_frame.h"
#include "desktop/windows/main_frame.h"
#include "desktop/windows/wx_text.h"
#include "platform/clock.h"
#include "platform/paths.h"
#include "processing/scale.h"

namespace fotomill::desktop {

namespace {

constexpr uint64_t kAheadBytes = 768ull * 1024 * 1024;  // of decoded pictures
constexpr int kSlideMs = 4000;
constexpr int kPointerMs = 2000;

wxColour ColourOf(int32_t color) {
  return {static_cast<unsigned char>(color), static_cast<unsigned char>(color >> 8), static_cast<unsigned char>(color >> 16)};
}

// What the keys do, in the order of the menu; a row without text is in no menu, one without keys a line of it.
struct ViewCommand {
  const char* text;
  const char* shownKey;
  int keys[3];
  void (*run)(ViewFrame& view);
};

template <int step>
void Step(ViewFrame& view) {
  view.Step(step);
}

// clang-format off
const ViewCommand kViewCommands[] = {
    {"&Next",             "Space",     {WXK_SPACE, WXK_PAGEDOWN, 'N'},  Step<1>},
    {"&Previous",         "Backspace", {WXK_BACK, WXK_PAGEUP, 'P'},     Step<-1>},
    {"&First",            "Home",      {WXK_HOME},                      [](ViewFrame& view) { view.GoTo(0); }},
    {"&Last",             "End",       {WXK_END},                       [](ViewFrame& view) { view.GoTo(view.LastPlace()); }},
    {nullptr, nullptr, {}, nullptr},
    {"Zoom &in",          "+",         {'+', '=', WXK_NUMPAD_ADD},      [](ViewFrame& view) { view.ZoomIn(); }},
    {"Zoom &out",         "-",         {'-', WXK_NUMPAD_SUBTRACT},      [](ViewFrame& view) { view.ZoomOut(); }},
    {"Fit to &window",    "0",         {'0', WXK_NUMPAD0},              [](ViewFrame& view) { view.SetZoom(ZoomMode::Fit); }},
    {"&Actual size",      "1",         {'1', WXK_NUMPAD1},              [](ViewFrame& view) { view.ZoomActual(); }},
    {"Fit to wi&dth",     "2",         {'2', WXK_NUMPAD2},              [](ViewFrame& view) { view.SetZoom(ZoomMode::FitWidth); }},
    {"Fi&ll the window",  "3",         {'3', WXK_NUMPAD3},              [](ViewFrame& view) { view.SetZoom(ZoomMode::Fill); }},
    {nullptr, nullptr, {}, nullptr},
    {"Next pa&ge",        "]",         {']'},                           [](ViewFrame& view) { view.StepPage(1); }},
    {"Pre&vious page",    "[",         {'['},                           [](ViewFrame& view) { view.StepPage(-1); }},
    {nullptr, nullptr, {}, nullptr},
    {"Full &screen",      "F11",       {WXK_F11, 'F'},                  [](ViewFrame& view) { view.ToggleFullScreen(); }},
    {"Slides&how",        "S",         {'S', WXK_F8},                   [](ViewFrame& view) { view.ToggleSlideshow(); }},
    {"In&formation",      "I",         {'I'},                           [](ViewFrame& view) { view.ToggleOverlay(); }},
    {"G&et info...",      "Alt+Enter", {},                              [](ViewFrame& view) { view.ShowInfoWindow(); }},
    {nullptr, nullptr, {}, nullptr},
    {"&Delete",           "Del",       {WXK_DELETE},                    [](ViewFrame& view) { view.DeleteFile(); }},
    {"&Copy picture",     "Ctrl+C",    {WXK_CONTROL_C},                 [](ViewFrame& view) { view.CopyPicture(); }},
    {"&Close",            "Esc",       {WXK_ESCAPE, WXK_RETURN, WXK_NUMPAD_ENTER}, [](ViewFrame& view) { view.Leave(); }},
};
// clang-format on

}  // namespace

class ViewFrame::Canvas : public wxWindow {
 public:
  explicit Canvas(ViewFrame& view) : view_(view) {
    SetBackgroundStyle(wxBG_STYLE_PAINT);
    Create(&view, wxID_ANY, wxDefaultPosition, wxDefaultSize, wxWANTS_CHARS | wxBORDER_NONE, "Picture");
    Bind(wxEVT_PAINT, [this](wxPaintEvent&) { view_.PaintCanvas(); });
    Bind(wxEVT_SIZE, [this](wxSizeEvent&) {
      const wxSize size = DeviceSize();
      view_.transform_.SetWindow(size.x, size.y);
      view_.WantPictures();
      view_.TransformChanged();
    });
    Bind(wxEVT_KEY_DOWN, &ViewFrame::OnKey, &view_);
    Bind(wxEVT_MOUSEWHEEL, [this](wxMouseEvent& event) {
      if (event.GetWheelRotation() == 0 || event.GetWheelDelta() == 0) return;
      const wxPoint place = event.GetPosition() * GetContentScaleFactor();
      view_.ZoomBy(std::pow(ViewTransform::kStep, static_cast<double>(event.GetWheelRotation()) / event.GetWheelDelta()), place.x,
                   place.y);
    });
    Bind(wxEVT_LEFT_DOWN, [this](wxMouseEvent& event) {
      drag_ = event.GetPosition();
      SetFocus();
      CaptureMouse();
    });
    Bind(wxEVT_LEFT_UP, [this](wxMouseEvent&) {
      if (HasCapture()) ReleaseMouse();
    });
    Bind(wxEVT_MOUSE_CAPTURE_LOST, [](wxMouseCaptureLostEvent&) {});
    Bind(wxEVT_MOTION, [this](wxMouseEvent& event) {
      view_.HidePointerLater();
      if (!HasCapture()) return;
      const wxPoint way = (event.GetPosition() - drag_) * GetContentScaleFactor();
      drag_ = event.GetPosition();
      view_.transform_.Pan(way.x, way.y);
      Refresh();
    });
    Bind(wxEVT_LEFT_DCLICK, [this](wxMouseEvent& event) {
      const wxPoint place = event.GetPosition() * GetContentScaleFactor();
      if (view_.transform_.Mode() == ZoomMode::Free) return view_.SetZoom(ZoomMode::Fit);
      view_.transform_.ZoomTo(1, place.x, place.y);
      view_.TransformChanged();
    });
    Bind(wxEVT_RIGHT_DOWN, [this](wxMouseEvent& event) { view_.ShowMenu(event.GetPosition()); });
  }
  wxSize DeviceSize() const { return GetClientSize() * GetContentScaleFactor(); }

 private:
  ViewFrame& view_;
  wxPoint drag_;
};

ViewFrame::ViewFrame(MainFrame& frame, const std::vector<std::string>& list, const std::string& file)
    : wxFrame(&frame, wxID_ANY, "View", wxDefaultPosition, wxDefaultSize, wxDEFAULT_FRAME_STYLE, "FotomillProfessionalView"),
      frame_(frame),
      list_(list),
      slideTimer_(this),
      pointerTimer_(this) {
  place_ = static_cast<size_t>(std::find(list_.begin(), list_.end(), file) - list_.begin());
  if (place_ == list_.size()) {
    list_ = {file};
    place_ = 0;
  }
  SetSize(frame.GetSize());
  loader_ = std::make_unique<ViewLoader>(kAheadBytes, [this] { CallAfter([this] { PictureCame(); }); });
  scaler_ = std::make_unique<ViewScaler>([this] { CallAfter([this] { ScaledCame(); }); });
  transform_.SetModeFromKey(settings.DefaultViewZoom);
  canvas_ = new Canvas(*this);
  CreateStatusBar();
  canvas_->SetFocus();
  Bind(
      wxEVT_TIMER, [this](wxTimerEvent&) { Step(1); }, slideTimer_.GetId());
  Bind(
      wxEVT_TIMER,
      [this](wxTimerEvent&) {
        if (IsFullScreen()) canvas_->SetCursor(wxCursor(wxCURSOR_BLANK));
      },
      pointerTimer_.GetId());
  if (settings.MaximizeViewWindow != 0) Maximize();
  ShowPlace();
}

ViewFrame::~ViewFrame() {
  // Their threads call back into this window.
  loader_.reset();
  scaler_.reset();
}

// --- which picture ---

ViewWish ViewFrame::WishOf(size_t place) const {
  const wxSize size = canvas_->DeviceSize();
  return {list_[place], place == place_ ? page_ : 0, size.x, size.y};
}

void ViewFrame::Step(int files) {
  const int64_t count = static_cast<int64_t>(list_.size());
  const int64_t place = (static_cast<int64_t>(place_) + files % count + count) % count;
  GoTo(static_cast<size_t>(place));
}

void ViewFrame::GoTo(size_t place) {
  if (place >= list_.size() || (place == place_ && page_ == 0 && shown_ != nullptr)) return;
  place_ = place;
  page_ = 0;
  ShowPlace();
}

void ViewFrame::StepPage(int pages) {
  if (shown_ == nullptr || shown_->picture == nullptr) return;
  const int32_t page = page_ + pages;
  if (page < 0 || page >= shown_->picture->pageCount) return;
  page_ = page;
  ShowPlace();
}

void ViewFrame::ShowPlace() {
  keyTime_ = platform::MonotonicSeconds();
  WantPictures();
  if (const ViewPicturePointer ready = loader_->Find(WishOf(place_))) {
    TakePicture(ready);
  } else {
    ShowPreview();
    UpdateTitle();
  }
}

// Until the picture is there its thumbnail stands in, where the browser has one.
void ViewFrame::ShowPreview() {
  preview_.Free();
  const ThumbnailPointer thumbnail = frame_.Thumbnails().FindAny(list_[place_]);
  if (thumbnail == nullptr || thumbnail->pixels.Empty() || ToPacked(thumbnail->pixels, preview_) != Status::Ok) return;
  constexpr int32_t kUnknown = 16;  // times the thumbnail, where its picture's size is not known
  const bool known = thumbnail->width > 0;
  int32_t width = known ? thumbnail->width : preview_.Width() * kUnknown;
  int32_t height = known ? thumbnail->height : preview_.Height() * kUnknown;
  if ((width > height) != (preview_.Width() > preview_.Height())) std::swap(width, height);  // it was turned upright
  transform_.SetPicture(width, height);
  canvas_->Refresh();
}

// The picture itself, then two each way.
void ViewFrame::WantPictures() {
  if (loader_ == nullptr || canvas_ == nullptr) return;
  std::vector<ViewWish> wishes;
  const int64_t count = static_cast<int64_t>(list_.size());
  for (const int64_t step : {0, 1, -1, 2, -2}) {
    const size_t place = static_cast<size_t>(((static_cast<int64_t>(place_) + step) % count + count) % count);
    ViewWish wish = WishOf(place);
    const auto same = [&](const ViewWish& other) { return other.SamePicture(wish); };
    if (std::none_of(wishes.begin(), wishes.end(), same)) wishes.push_back(std::move(wish));
  }
  loader_->Want(std::move(wishes));
}

void ViewFrame::PictureCame() {
  if (shown_ != nullptr && shown_->wish.SamePicture(WishOf(place_))) return;
  if (const ViewPicturePointer ready = loader_->Find(WishOf(place_))) TakePicture(ready);
}

void ViewFrame::TakePicture(ViewPicturePointer picture) {
  shown_ = std::move(picture);
  scaled_.reset();
  preview_.Free();
  if (shown_->picture != nullptr) {
    transform_.SetPicture(shown_->picture->image.Width(), shown_->picture->image.Height());
    frame_.NoteUses({FileUse{list_[place_], FileFunction::View}});
  }
  TransformChanged();
  if (slideTimer_.IsRunning()) slideTimer_.Start(kSlideMs);
  LogEvent("view", "place=" + std::to_string(place_ + 1) + "/" + std::to_string(list_.size()) +
                       " page=" + std::to_string(page_ + 1) + " status=" + std::to_string(StatusNumber(shown_->status)) + " ms=" +
                       std::to_string(std::lround((platform::MonotonicSeconds() - keyTime_) * 1000)) + " file=" + list_[place_]);
}

// --- zoom ---

void ViewFrame::ZoomBy(double factor, double x, double y) {
  const wxSize size = canvas_->DeviceSize();
  transform_.ZoomBy(factor, x < 0 ? size.x / 2.0 : x, y < 0 ? size.y / 2.0 : y);
  TransformChanged();
}

void ViewFrame::SetZoom(ZoomMode mode) {
  transform_.SetMode(mode);
  TransformChanged();
}

void ViewFrame::ZoomActual() {
  transform_.ZoomToMiddle(1);
  TransformChanged();
}

void ViewFrame::PanBy(int stepsAcross, int stepsDown) {
  const wxSize size = canvas_->DeviceSize();
  transform_.Pan(-stepsAcross * size.x / 8.0, -stepsDown * size.y / 8.0);
  canvas_->Refresh();
}

// The picture is drawn at once from what there is; a smaller scale then gets pixels that are made for it.
void ViewFrame::TransformChanged() {
  if (preview_.Empty() && shown_ != nullptr && shown_->picture != nullptr && transform_.Scale() < 1) {
    const PackedImage* source = BestSource();
    const bool exact = source->Width() == transform_.ShownWidth() && source->Height() == transform_.ShownHeight();
    if (!exact) scaler_->Request(shown_, transform_.ShownWidth(), transform_.ShownHeight());
  }
  UpdateTitle();
  canvas_->Refresh();
}

void ViewFrame::ScaledCame() {
  std::unique_ptr<ViewScaler::Scaled> scaled = scaler_->Take();
  if (scaled == nullptr || scaled->picture != shown_) return;
  scaled_ = std::move(scaled);
  canvas_->Refresh();
}

const PackedImage* ViewFrame::BestSource() const {
  const auto fits = [this](const PackedImage& image) {
    return image.Width() == transform_.ShownWidth() && image.Height() == transform_.ShownHeight();
  };
  if (fits(shown_->fitted)) return &shown_->fitted;
  if (scaled_ != nullptr && fits(scaled_->image)) return &scaled_->image;
  return &shown_->picture->image;
}

// --- showing ---

void ViewFrame::PaintCanvas() {
  wxPaintDC dc(canvas_);
  const double scale = canvas_->GetContentScaleFactor();
  const wxSize size = canvas_->DeviceSize();
  const wxColour background = ColourOf(settings.ViewModeBackground);
  const bool previewing = !preview_.Empty();
  if (size.x < 1 || size.y < 1) return;
  if (!previewing && (shown_ == nullptr || shown_->picture == nullptr)) {
    dc.SetBackground(wxBrush(background));
    dc.Clear();
    dc.SetTextForeground(*wxBLACK);
    const wxString text =
        shown_ == nullptr ? wxString() : Shown(list_[place_] + "\n" + std::string(StatusMessage(shown_->status)));
    dc.DrawLabel(text, wxRect(canvas_->GetClientSize()), wxALIGN_CENTER);
  } else {
    RgbImage pixels;
    pixels.width = size.x;
    pixels.height = size.y;
    pixels.bytes.resize(static_cast<size_t>(size.x) * static_cast<size_t>(size.y) * 3);
    const bool smooth = transform_.Scale() < 2 && ScaleFilterFromKey(settings.ResizeFilter) != ScaleFilter::Nearest;
    DrawView(previewing ? preview_ : *BestSource(), transform_, static_cast<Color>(settings.ViewModeBackground), smooth, pixels);
    dc.DrawBitmap(BitmapOf(pixels, scale), 0, 0);
    if (!previewing) LogPaint();
  }
  if (!overlay_) return;
  const wxString text = Shown(StatusLine());
  const wxSize extent = dc.GetTextExtent(text) + FromDIP(wxSize(20, 10));
  dc.SetPen(*wxTRANSPARENT_PEN);
  dc.SetBrush(wxBrush(wxColour(0, 0, 0, 170)));
  dc.DrawRoundedRectangle(wxPoint(FromDIP(12), FromDIP(12)), extent, FromDIP(6));
  dc.SetTextForeground(*wxWHITE);
  dc.DrawText(text, FromDIP(22), FromDIP(17));
}

// Each picture and zoom once, with the time since the picture was asked for.
void ViewFrame::LogPaint() {
  const std::string shown = std::to_string(std::lround(transform_.Scale() * 100)) + "% " + shown_->wish.path;
  if (shown == painted_) return;
  painted_ = shown;
  LogEvent("view-painted", shown + " ms=" + std::to_string(std::lround((platform::MonotonicSeconds() - keyTime_) * 1000)));
}

std::string ViewFrame::StatusLine() const {
  std::string line = std::to_string(place_ + 1) + " of " + WithThousands(list_.size());
  const bool current = shown_ != nullptr && shown_->wish.SamePicture(WishOf(place_));
  if (!current) return line + ", loading...";
  if (shown_->picture == nullptr) return line + ", " + std::string(StatusMessage(shown_->status));
  const PictureRecord& picture = *shown_->picture;
  line += ", " + std::to_string(picture.image.Width()) + " x " + std::to_string(picture.image.Height()) + " pixels, " +
          SizeText(picture.fileSize, choice::kSizeFitting) + ", " + std::to_string(std::lround(transform_.Scale() * 100)) + "%";
  if (picture.pageCount > 1) line += ", page " + std::to_string(page_ + 1) + " of " + std::to_string(picture.pageCount);
  return line;
}

void ViewFrame::UpdateTitle() {
  SetTitle(Shown(platform::FileNameOf(list_[place_])) + " - View");
  if (GetStatusBar() != nullptr) SetStatusText(Shown(StatusLine()));
}

void ViewFrame::ToggleFullScreen() {
  ShowFullScreen(!IsFullScreen());
  HidePointerLater();
}

void ViewFrame::HidePointerLater() {
  canvas_->SetCursor(wxNullCursor);
  if (IsFullScreen()) pointerTimer_.StartOnce(kPointerMs);
}

void ViewFrame::ToggleSlideshow() {
  if (slideTimer_.IsRunning()) return slideTimer_.Stop();
  if (!IsFullScreen()) ToggleFullScreen();
  slideTimer_.Start(kSlideMs);
}

void ViewFrame::ShowInfoWindow() { (new InfoFrame(frame_, this, {list_[place_]}))->Show(); }

void ViewFrame::ToggleOverlay() {
  overlay_ = !overlay_;
  canvas_->Refresh();
}

void ViewFrame::Leave() {
  slideTimer_.Stop();
  if (IsFullScreen()) return ToggleFullScreen();
  if (BrowserPage* browser = frame_.Browser()) browser->FocusName(std::string(platform::FileNameOf(list_[place_])));
  Close();
}

void ViewFrame::DeleteFile() {
  const std::string path = list_[place_];
  if (settings.PromptDeleteFromView != 0) {
    wxMessageDialog dialog(this, "Move " + Shown(platform::FileNameOf(path)) + " to the trash?", "Delete",
                           wxOK | wxCANCEL | wxICON_QUESTION);
    dialog.SetOKLabel("&Delete");
    if (dialog.ShowModal() != wxID_OK) return;
  }
  frame_.Files().Trash({path});
  loader_->Forget(path);
  list_.erase(list_.begin() + static_cast<std::ptrdiff_t>(place_));
  if (list_.empty()) {
    Close();
    return;
  }
  place_ = std::min(place_, list_.size() - 1);
  page_ = 0;
  ShowPlace();
}

void ViewFrame::CopyPicture() {
  if (shown_ == nullptr || shown_->picture == nullptr) return;
  RgbImage pixels;
  if (ToRgb(shown_->picture->image, pixels) != Status::Ok) return wxBell();
  const wxClipboardLocker clipboard;
  if (!clipboard || !wxTheClipboard->SetData(new wxBitmapDataObject(BitmapOf(pixels)))) return wxBell();
  SetStatusText("The picture is on the clipboard.");
}

// --- keys ---

void ViewFrame::OnKey(wxKeyEvent& event) {
  const int key = event.GetKeyCode();
  if (CanPan()) {
    if (key == WXK_LEFT) return PanBy(-1, 0);
    if (key == WXK_RIGHT) return PanBy(1, 0);
    if (key == WXK_UP) return PanBy(0, -1);
    if (key == WXK_DOWN) return PanBy(0, 1);
  }
  if (key == WXK_LEFT || key == WXK_UP) return Step(-1);
  if (key == WXK_RIGHT || key == WXK_DOWN) return Step(1);
  if (event.AltDown() && key == WXK_RETURN) return ShowInfoWindow();
  if (event.AltDown()) return event.Skip();
  const int typed = event.ControlDown() ? (key == 'C' ? static_cast<int>(WXK_CONTROL_C) : 0) : key;
  for (const ViewCommand& command : kViewCommands) {
    for (const int own : command.keys) {
      if (own != 0 && own == typed) return command.run(*this);
    }
  }
  event.Skip();
}

void ViewFrame::ShowMenu(const wxPoint& place) {
  if (settings.RightClickMenuInView == 0) return;
  wxMenu menu;
  for (const ViewCommand& command : kViewCommands) {
    if (command.text == nullptr) {
      menu.AppendSeparator();
      continue;
    }
    const int id = wxID_HIGHEST + 1 + static_cast<int>(&command - kViewCommands);
    // Shown beside the text; the key itself is the canvas's.
    menu.Append(id, wxString(command.text) + "    " + command.shownKey);
    menu.Bind(
        wxEVT_MENU, [this, run = command.run](wxCommandEvent&) { run(*this); }, id);
  }
  canvas_->PopupMenu(&menu, place);
}

}  // namespace fotomill::desktop
