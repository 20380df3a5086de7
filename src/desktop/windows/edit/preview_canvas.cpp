#include "desktop/windows/edit/preview_canvas.h"

#include <wx/dcclient.h>
#include <wx/settings.h>

#include <algorithm>
#include <cmath>
#include <cstring>
#include <utility>

#include "desktop/windows/view/canvas_backdrop.h"
#include "desktop/windows/widgets/bitmaps.h"
#include "desktop/windows/widgets/wx_text.h"
#include "settings/settings.h"

namespace fotomill::desktop {

namespace {

constexpr int kNear = 6;  // distance from which the line can be dragged

bool IsWhole(const Preview& preview) {
  return preview.area.width == preview.whole.width && preview.area.height == preview.whole.height;
}

}  // namespace

PreviewCanvas::PreviewCanvas(wxWindow* parent, std::function<void()> placed)
    : EditCanvas(parent, Label("Preview")), placed_(std::move(placed)) {
  Bind(wxEVT_PAINT, &PreviewCanvas::OnPaint, this);
  Bind(wxEVT_SIZE, [this](wxSizeEvent&) { Placed(); });
  Bind(wxEVT_MOUSEWHEEL, &PreviewCanvas::OnWheel, this);
  for (const auto type : {wxEVT_LEFT_DOWN, wxEVT_LEFT_UP, wxEVT_MOTION, wxEVT_LEFT_DCLICK})
    Bind(type, &PreviewCanvas::OnMouse, this);
  Bind(wxEVT_MOUSE_CAPTURE_LOST, [this](wxMouseCaptureLostEvent&) { movesSplit_ = false; });
}

wxSize PreviewCanvas::PaneSize() const {
  wxSize size = GetClientSize() * DeviceScale();
  if (mode_ == PreviewMode::Sides) size.x = (size.x - FromDIP(4)) / 2;
  return {std::max(size.x, 1), std::max(size.y, 1)};
}

void PreviewCanvas::StartAfresh() {
  before_ = after_ = {};
  transform_.SetMode(ZoomMode::Fit);
  ShowProblem({});
}

void PreviewCanvas::Take(PreviewPointer preview) {
  Layers& layers = preview->original ? before_ : after_;
  const bool same = layers.whole != nullptr && layers.whole->steps == preview->steps;
  if (preview->exact && !IsWhole(*preview)) {
    layers.part = std::move(preview);
  } else if (!(same && layers.whole->exact && !preview->exact)) {
    layers.whole = std::move(preview);
    const bool stale = layers.part != nullptr && !layers.whole->original &&
                       layers.part->steps != layers.whole->steps;
    if (stale || layers.whole->exact) layers.part.reset();
  }
  const PreviewPointer& newest = after_.part != nullptr ? after_.part : after_.whole;
  if (newest != nullptr) transform_.SetPicture(newest->whole.width, newest->whole.height);
  ShowProblem({});
}

void PreviewCanvas::SetMode(PreviewMode mode) {
  mode_ = mode;
  Placed();
}

void PreviewCanvas::ShowOriginal(bool show) {
  if (std::exchange(original_, show) == show) return;
  if (show && before_.whole == nullptr) placed_();
  Refresh();
}

// --- zoom ---

void PreviewCanvas::Placed() {
  const wxSize pane = PaneSize();
  transform_.SetWindow(pane.x, pane.y);
  placed_();
  Refresh();
}

void PreviewCanvas::ZoomBy(double factor) {
  const wxSize pane = PaneSize();
  transform_.ZoomBy(factor, pane.x / 2.0, pane.y / 2.0);
  Placed();
}

void PreviewCanvas::SetZoom(ZoomMode mode) {
  transform_.SetMode(mode);
  Placed();
}

void PreviewCanvas::ZoomActual() {
  transform_.ZoomToMiddle(1);
  Placed();
}

void PreviewCanvas::OnWheel(wxMouseEvent& event) {
  if (event.GetWheelRotation() == 0 || event.GetWheelDelta() == 0) return;
  wxPoint place = event.GetPosition() * DeviceScale();
  place.x %= PaneSize().x;
  const double steps = static_cast<double>(event.GetWheelRotation()) / event.GetWheelDelta();
  transform_.ZoomBy(std::pow(ViewTransform::kStep, steps), place.x, place.y);
  Placed();
}

bool PreviewCanvas::NearSplit(const wxPoint& place) const {
  return mode_ == PreviewMode::Split &&
         std::abs(place.x - split_ * GetClientSize().x) <= FromDIP(kNear);
}

void PreviewCanvas::OnMouse(wxMouseEvent& event) {
  const wxPoint place = event.GetPosition();
  if (event.LeftDClick()) {
    const bool fits = transform_.Mode() != ZoomMode::Free;
    return fits ? ZoomActual() : SetZoom(ZoomMode::Fit);
  }
  if (event.LeftDown()) {
    SetFocus();
    movesSplit_ = NearSplit(place);
    drag_ = place;
    if (!HasCapture()) CaptureMouse();
    return;
  }
  if (event.LeftUp()) {
    if (HasCapture()) ReleaseMouse();
    movesSplit_ = false;
    return;
  }
  SetCursor(movesSplit_ || NearSplit(place) ? wxCursor(wxCURSOR_SIZEWE) : wxNullCursor);
  if (!HasCapture()) return;
  if (movesSplit_) {
    split_ = std::clamp(static_cast<double>(place.x) / std::max(GetClientSize().x, 1), 0.0, 1.0);
    return Refresh();
  }
  const wxPoint way = (place - drag_) * DeviceScale();
  drag_ = place;
  transform_.Pan(way.x, way.y);
  Placed();
}

// --- painting ---

// Shows the original at the place of the result.
ViewTransform PreviewCanvas::TransformOf(const Layers& layers) const {
  ViewTransform transform;
  const PreviewPointer& newest = layers.part != nullptr ? layers.part : layers.whole;
  if (newest != nullptr) transform.SetPicture(newest->whole.width, newest->whole.height);
  const wxSize pane = PaneSize();
  transform.SetWindow(pane.x, pane.y);
  transform.SetPlace(transform_.Place());
  return transform;
}

void PreviewCanvas::Draw(const Layers& layers, const ViewTransform& transform,
                         RgbImage& pixels) const {
  const Backdrop backdrop = BackdropFor(*this);
  const bool smooth = transform.Scale() < 2;
  if (layers.whole == nullptr) {
    pixels = FilledImage(pixels.width, pixels.height, backdrop.around);
  } else {
    const ViewPixels& whole = layers.whole->pixels;
    DrawView({whole.image, whole.alpha}, transform, backdrop, smooth, pixels);
  }
  if (layers.part == nullptr) return;
  const double scale = transform.Scale();
  const Rectangle& area = layers.part->area;
  const auto shown = [scale](int32_t edge) {
    return static_cast<int32_t>(std::lround(edge * scale));
  };
  DrawPart({layers.part->pixels.image, layers.part->pixels.alpha},
           {transform.X() + shown(area.x), transform.Y() + shown(area.y), shown(area.width),
            shown(area.height)},
           backdrop, smooth, pixels);
}

void PreviewCanvas::OnPaint(wxPaintEvent&) {
  wxPaintDC dc(this);
  const wxSize pane = PaneSize();
  RgbImage after;
  after.width = pane.x;
  after.height = pane.y;
  after.bytes.resize(static_cast<size_t>(pane.x) * static_cast<size_t>(pane.y) * 3);
  RgbImage before = after;
  const bool split = mode_ == PreviewMode::Split && !original_;
  if (original_ || split || mode_ == PreviewMode::Sides)
    Draw(before_, TransformOf(before_), before);
  Draw(after_, transform_, after);
  if (split) {
    const auto columns = static_cast<size_t>(std::lround(split_ * pane.x));
    for (int32_t y = 0; y < pane.y; ++y) std::memcpy(after.Row(y), before.Row(y), 3 * columns);
  }
  const double scale = DeviceScale();
  if (mode_ == PreviewMode::Sides) {
    const int second = static_cast<int>((pane.x + FromDIP(4)) / scale);
    dc.SetBackground(wxBrush(wxSystemSettings::GetColour(wxSYS_COLOUR_3DFACE)));
    dc.Clear();
    dc.DrawBitmap(BitmapOf(before, scale), 0, 0);
    dc.DrawBitmap(BitmapOf(original_ ? before : after, scale), second, 0);
  } else {
    dc.DrawBitmap(BitmapOf(original_ ? before : after, scale), 0, 0);
  }
  if (split) PaintDivider(dc);
  PaintProblem(dc);
}

void PreviewCanvas::PaintDivider(wxDC& dc) const {
  const wxSize size = GetClientSize();
  const int x = static_cast<int>(std::lround(split_ * size.x));
  dc.SetPen(wxPen(wxColour(0, 0, 0, 120), FromDIP(3)));
  dc.DrawLine(x, 0, x, size.y);
  dc.SetPen(wxPen(*wxWHITE, FromDIP(1)));
  dc.DrawLine(x, 0, x, size.y);
  dc.SetBrush(*wxWHITE_BRUSH);
  dc.DrawCircle(x, size.y / 2, FromDIP(5));
  const wxString texts[] = {Label("Before"), Label("After")};
  for (int side = 0; side < 2; ++side) {
    const wxSize extent = dc.GetTextExtent(texts[side]) + FromDIP(wxSize(12, 6));
    const wxRect box(wxPoint(side == 0 ? x - extent.x - FromDIP(8) : x + FromDIP(8), FromDIP(8)),
                     extent);
    dc.SetPen(*wxTRANSPARENT_PEN);
    dc.SetBrush(wxBrush(wxColour(0, 0, 0, 150)));
    dc.DrawRoundedRectangle(box, FromDIP(4));
    dc.SetTextForeground(*wxWHITE);
    dc.DrawLabel(texts[side], box, wxALIGN_CENTER);
  }
}

}  // namespace fotomill::desktop
