#include "desktop/windows/view/view_canvas.h"

#include <wx/control.h>
#include <wx/dcclient.h>
#include <wx/settings.h>

#include <algorithm>
#include <cmath>

#include "core/choice_lists.h"
#include "desktop/models/drawing/list_palette.h"
#include "desktop/models/shell/event_log.h"
#include "desktop/windows/view/canvas_backdrop.h"
#include "desktop/windows/widgets/bitmaps.h"
#include "desktop/windows/widgets/wx_text.h"
#include "platform/clock.h"
#include "platform/paths.h"
#include "processing/geometry/scale.h"
#include "settings/settings.h"
#include "texts/texts.h"

namespace fotomill::desktop {

namespace {

constexpr int kPanSteps = 8;          // per window size
constexpr double kPlainPixelsAt = 2;  // from this zoom on, pixels are drawn as squares

wxColour ColorOf(Color color) {
  return {static_cast<unsigned char>(color), static_cast<unsigned char>(color >> 8),
          static_cast<unsigned char>(color >> 16)};
}

}  // namespace

ViewCanvas::ViewCanvas(wxWindow* parent, Events events) : events_(std::move(events)) {
  SetBackgroundStyle(wxBG_STYLE_PAINT);
  Create(parent, wxID_ANY, wxDefaultPosition, wxDefaultSize, wxWANTS_CHARS | wxBORDER_NONE,
         Label("Picture"));
  around_ = BackdropFor(*this).around;
  scaler_ = std::make_unique<ViewScaler>(
      [this, post = calls_.Poster()] { post([this] { ScaledCame(); }); });
  transform_.SetModeFromKey(settings.DefaultViewZoom);
  Bind(wxEVT_PAINT, &ViewCanvas::OnPaint, this);
  Bind(wxEVT_SIZE, &ViewCanvas::OnSize, this);
  Bind(wxEVT_MOUSEWHEEL, &ViewCanvas::OnWheel, this);
  Bind(wxEVT_LEFT_DOWN, &ViewCanvas::OnLeftDown, this);
  Bind(wxEVT_LEFT_UP, &ViewCanvas::OnLeftUp, this);
  Bind(wxEVT_LEFT_DCLICK, &ViewCanvas::OnDoubleClick, this);
  Bind(wxEVT_MOTION, &ViewCanvas::OnMotion, this);
  Bind(wxEVT_MOUSE_CAPTURE_LOST, [](wxMouseCaptureLostEvent&) {});
}

ViewCanvas::~ViewCanvas() { DestroyInBackground(std::move(scaler_)); }

void ViewCanvas::Show(ViewPicturePointer picture) {
  picture_ = std::move(picture);
  scaled_.reset();
  standIn_.Free();
  if (Showable())
    transform_.SetPicture(picture_->picture->image.Width(), picture_->picture->image.Height());
  TransformChanged();
}

void ViewCanvas::ShowFrame(ViewPicturePointer frame, bool plays) {
  if (!plays) return Show(std::move(frame));
  picture_ = std::move(frame);
  scaled_.reset();
  transform_.SetPicture(picture_->picture->image.Width(), picture_->picture->image.Height());
  Redraw();
}

void ViewCanvas::ShowStandIn(PackedImage image, int32_t width, int32_t height) {
  standIn_ = std::move(image);
  transform_.SetPicture(width, height);
  Redraw();
}

void ViewCanvas::StartAfresh() {
  if (settings.ViewModeKeepZoom == 0) transform_.StartAfresh(settings.DefaultViewZoom);
}

void ViewCanvas::SetOverlay(const std::vector<std::string>& lines) {
  wxString text;
  for (const std::string& line : lines) text += (text.empty() ? "" : "\n") + Shown(line);
  if (text == overlay_) return;
  overlay_ = text;
  Redraw();
}

void ViewCanvas::SetNote(const wxString& note) {
  if (note == note_) return;
  note_ = note;
  Refresh();
}

void ViewCanvas::SetAround(Color color) {
  if (color == around_) return;
  around_ = color;
  Redraw();
}

// --- zoom ---

void ViewCanvas::ZoomBy(double factor) {
  const wxSize size = DeviceSize();
  transform_.ZoomBy(factor, size.x / 2.0, size.y / 2.0);
  UserZoomed();
}

void ViewCanvas::ZoomActual() {
  transform_.ZoomToMiddle(1);
  UserZoomed();
}

void ViewCanvas::SetZoom(ZoomMode mode) {
  transform_.SetMode(mode);
  UserZoomed();
}

void ViewCanvas::PanBy(int stepsAcross, int stepsDown) {
  const wxSize size = DeviceSize();
  transform_.Pan(-static_cast<double>(stepsAcross) * size.x / kPanSteps,
                 -static_cast<double>(stepsDown) * size.y / kPanSteps);
  UserPanned();
}

bool ViewCanvas::PanByKey(int key) {
  if (!CanPan()) return false;
  switch (key) {
    case WXK_LEFT: PanBy(-1, 0); return true;
    case WXK_RIGHT: PanBy(1, 0); return true;
    case WXK_UP: PanBy(0, -1); return true;
    case WXK_DOWN: PanBy(0, 1); return true;
    default: return false;
  }
}

void ViewCanvas::SetPlace(const ViewPlace& place) {
  transform_.SetPlace(place);
  TransformChanged();
}

void ViewCanvas::UserZoomed() {
  TransformChanged();
  if (events_.placed) events_.placed();
}

void ViewCanvas::UserPanned() {
  Redraw();
  if (events_.placed) events_.placed();
}

// Draws what is available immediately; if reduced, then requests pixels scaled for this size.
void ViewCanvas::TransformChanged() {
  if (standIn_.Empty() && Showable() && transform_.Scale() < 1) {
    const PackedImage& source = BestSource().image;
    const bool exact =
        source.Width() == transform_.ShownWidth() && source.Height() == transform_.ShownHeight();
    if (!exact) scaler_->Request(picture_, transform_.ShownWidth(), transform_.ShownHeight());
  }
  events_.changed();
  Redraw();
}

void ViewCanvas::ScaledCame() {
  std::unique_ptr<ViewScaler::Scaled> scaled = scaler_->Fetch();
  if (scaled == nullptr || scaled->picture != picture_) return;
  scaled_ = std::move(scaled);
  Redraw();
}

ViewSource ViewCanvas::BestSource() const {
  const auto fits = [this](const ViewPixels& pixels) {
    return pixels.image.Width() == transform_.ShownWidth() &&
           pixels.image.Height() == transform_.ShownHeight();
  };
  if (fits(picture_->fitted)) return {picture_->fitted.image, picture_->fitted.alpha};
  if (scaled_ != nullptr && fits(scaled_->pixels))
    return {scaled_->pixels.image, scaled_->pixels.alpha};
  return {picture_->picture->image, picture_->picture->alpha};
}

// --- painting ---

// Logs paint events that take longer than a screen frame.
void ViewCanvas::OnPaint(wxPaintEvent&) {
  constexpr double kFrame = 1.0 / 60;
  const double start = platform::MonotonicSeconds();
  Paint();
  const double seconds = platform::MonotonicSeconds() - start;
  if (seconds > kFrame) LogEvent("slow-paint", std::to_string(std::lround(seconds * 1000)) + " ms");
}

void ViewCanvas::Paint() {
  wxPaintDC dc(this);
  if (DeviceSize().x < 1 || DeviceSize().y < 1) return;
  if (standIn_.Empty() && !Showable()) {
    PaintMessage(dc);
  } else {
    PaintPicture(dc);
  }
  if (!overlay_.empty()) PaintOverlay(dc);
  if (!note_.empty()) PaintNote(dc);
  if (events_.decorate) events_.decorate(dc);
  if (standIn_.Empty() && Showable()) events_.painted();
}

void ViewCanvas::Redraw() {
  drawn_ = wxNullBitmap;
  Refresh();
}

void ViewCanvas::PaintPicture(wxDC& dc) {
  if (!drawn_.IsOk()) drawn_ = DrawnPicture();
  dc.DrawBitmap(drawn_, 0, 0);
}

wxBitmap ViewCanvas::DrawnPicture() const {
  const wxSize size = DeviceSize();
  RgbImage pixels;
  pixels.width = size.x;
  pixels.height = size.y;
  pixels.bytes.resize(static_cast<size_t>(size.x) * static_cast<size_t>(size.y) * 3);
  const bool smooth = transform_.Scale() < kPlainPixelsAt &&
                      ScaleFilterFromKey(settings.ResizeFilter) != ScaleFilter::Nearest;
  const PackedImage opaque;
  const ViewSource source = standIn_.Empty() ? BestSource() : ViewSource{standIn_, opaque};
  Backdrop backdrop = BackdropFor(*this);
  backdrop.around = around_;
  DrawView(source, transform_, backdrop, smooth, pixels);
  return BitmapOf(pixels, GetContentScaleFactor());
}

void ViewCanvas::PaintMessage(wxDC& dc) const {
  const wxColour around = ColorOf(around_);
  dc.SetBackground(wxBrush(around));
  dc.Clear();
  if (picture_ == nullptr) return;
  const Shade text = Readable({0, 0, 0}, {around.Red(), around.Green(), around.Blue()});
  dc.SetTextForeground(wxColour(text.red, text.green, text.blue));
  const std::string name(platform::FileNameOf(picture_->request.path));
  dc.DrawLabel(Shown(name) + "\n" + Shown(picture_->problem), wxRect(GetClientSize()),
               wxALIGN_CENTER);
}

void ViewCanvas::PaintOverlay(wxDC& dc) const {
  const wxSize extent = dc.GetMultiLineTextExtent(overlay_) + FromDIP(wxSize(20, 10));
  dc.SetPen(*wxTRANSPARENT_PEN);
  dc.SetBrush(wxBrush(wxColour(0, 0, 0, 170)));
  dc.DrawRoundedRectangle(wxPoint(FromDIP(12), FromDIP(12)), extent, FromDIP(6));
  dc.SetTextForeground(*wxWHITE);
  dc.DrawText(overlay_, FromDIP(22), FromDIP(17));
}

// Dark on yellow, in the middle of the upper edge.
void ViewCanvas::PaintNote(wxDC& dc) const {
  const int gap = FromDIP(10);
  const wxString text =
      wxControl::Ellipsize(note_, dc, wxELLIPSIZE_END, GetClientSize().x - 6 * gap);
  const wxSize extent = dc.GetTextExtent(text) + wxSize(2 * gap, gap);
  const wxPoint corner((GetClientSize().x - extent.x) / 2, gap);
  dc.SetPen(*wxTRANSPARENT_PEN);
  dc.SetBrush(wxBrush(wxColour(0xff, 0xe0, 0x82)));
  dc.DrawRoundedRectangle(corner, extent, FromDIP(6));
  dc.SetTextForeground(*wxBLACK);
  dc.DrawText(text, corner.x + gap, corner.y + gap / 2);
}

// --- mouse ---

void ViewCanvas::OnSize(wxSizeEvent&) {
  const wxSize size = DeviceSize();
  transform_.SetWindow(size.x, size.y);
  events_.resized();
  TransformChanged();
}

void ViewCanvas::OnWheel(wxMouseEvent& event) {
  if (event.GetWheelRotation() == 0 || event.GetWheelDelta() == 0) return;
  const wxPoint place = event.GetPosition() * GetContentScaleFactor();
  const double steps = static_cast<double>(event.GetWheelRotation()) / event.GetWheelDelta();
  transform_.ZoomBy(std::pow(ViewTransform::kStep, steps), place.x, place.y);
  UserZoomed();
}

void ViewCanvas::OnLeftDown(wxMouseEvent& event) {
  drag_ = event.GetPosition();
  SetFocus();
  CaptureMouse();
}

void ViewCanvas::OnLeftUp(wxMouseEvent&) {
  if (HasCapture()) ReleaseMouse();
}

void ViewCanvas::OnMotion(wxMouseEvent& event) {
  event.Skip();
  if (!HasCapture()) return;
  const wxPoint way = (event.GetPosition() - drag_) * GetContentScaleFactor();
  drag_ = event.GetPosition();
  transform_.Pan(way.x, way.y);
  UserPanned();
}

void ViewCanvas::OnDoubleClick(wxMouseEvent& event) {
  if (transform_.Mode() == ZoomMode::Free) return SetZoom(ZoomMode::Fit);
  const wxPoint place = event.GetPosition() * GetContentScaleFactor();
  transform_.ZoomTo(1, place.x, place.y);
  UserZoomed();
}

}  // namespace fotomill::desktop
