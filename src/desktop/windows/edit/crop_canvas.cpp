#include "desktop/windows/edit/crop_canvas.h"

#include <wx/dcbuffer.h>
#include <wx/dcgraph.h>

#include <algorithm>
#include <cmath>
#include <numbers>
#include <utility>

#include "desktop/models/drawing/rgb_image.h"
#include "desktop/windows/view/canvas_backdrop.h"
#include "desktop/windows/widgets/bitmaps.h"
#include "desktop/windows/widgets/wx_text.h"

namespace fotomill::desktop {

namespace {

constexpr int kMargin = 16;  // around the picture, so that its edges can be grabbed
constexpr int kNear = 8;     // distance from which an edge can be grabbed
constexpr int kHandle = 9;   // side of a handle
constexpr double kMostZoom = 4;

wxStockCursor CursorOf(CropGrip grip) {
  switch (grip) {
    case CropGrip::Inside: return wxCURSOR_SIZING;
    case CropGrip::Left:
    case CropGrip::Right: return wxCURSOR_SIZEWE;
    case CropGrip::Top:
    case CropGrip::Bottom: return wxCURSOR_SIZENS;
    case CropGrip::TopLeft:
    case CropGrip::BottomRight: return wxCURSOR_SIZENWSE;
    case CropGrip::TopRight:
    case CropGrip::BottomLeft: return wxCURSOR_SIZENESW;
    case CropGrip::None: break;
  }
  return wxCURSOR_CROSS;
}

}  // namespace

CropCanvas::CropCanvas(wxWindow* parent, CropArea& area, Events events)
    : EditCanvas(parent, Label("Crop rectangle")), events_(std::move(events)), area_(area) {
  Bind(wxEVT_PAINT, &CropCanvas::OnPaint, this);
  Bind(wxEVT_SIZE, [this](wxSizeEvent&) {
    events_.resized();
    Refresh();
  });
  for (const auto type : {wxEVT_LEFT_DOWN, wxEVT_LEFT_UP, wxEVT_MOTION})
    Bind(type, &CropCanvas::OnMouse, this);
  Bind(wxEVT_MOUSE_CAPTURE_LOST, [this](wxMouseCaptureLostEvent&) { grip_ = CropGrip::None; });
  Bind(wxEVT_KEY_DOWN, &CropCanvas::OnKey, this);
}

wxSize CropCanvas::PaneSize() const {
  const wxSize size =
      (GetClientSize() - FromDIP(wxSize(2 * kMargin, 2 * kMargin))) * GetContentScaleFactor();
  return {std::max(size.x, 1), std::max(size.y, 1)};
}

void CropCanvas::StartAfresh() { Take(nullptr); }

void CropCanvas::Take(PreviewPointer preview) {
  shown_ = std::move(preview);
  ShowProblem({});
}

void CropCanvas::SetLines(CropLines lines) {
  lines_ = lines;
  Refresh();
}

void CropCanvas::DrawLevel(bool draw) {
  drawsLevel_ = draw;
  SetCursor(wxCursor(draw ? wxCURSOR_PENCIL : wxCURSOR_CROSS));
}

// --- geometry ---

double CropCanvas::Scale() const {
  const wxSize pane = PaneSize();
  const Size size = area_.Picture();
  const double fit = std::min(1.0 * pane.x / size.width, 1.0 * pane.y / size.height);
  return std::min(fit, kMostZoom) / GetContentScaleFactor();
}

wxRect CropCanvas::PictureOnScreen() const {
  const Size size = area_.Picture();
  const wxSize shown(static_cast<int>(std::lround(size.width * Scale())),
                     static_cast<int>(std::lround(size.height * Scale())));
  return wxRect(shown).CentreIn(wxRect(GetClientSize()));
}

wxRect CropCanvas::ShownArea() const {
  const wxRect picture = PictureOnScreen();
  const Rectangle& area = area_.Area();
  const auto shown = [scale = Scale()](int32_t place) {
    return static_cast<int>(std::lround(place * scale));
  };
  const int left = shown(area.x), top = shown(area.y);
  return {picture.x + left, picture.y + top, std::max(1, shown(area.x + area.width) - left),
          std::max(1, shown(area.y + area.height) - top)};
}

CropGrip CropCanvas::GripAtPoint(const wxPoint& place) const {
  const wxRect shown = ShownArea();
  const CropGrip grip =
      GripAt({shown.x, shown.y, shown.width, shown.height}, place.x, place.y, FromDIP(kNear));
  return fixed_ && grip != CropGrip::None ? CropGrip::Inside : grip;
}

wxRealPoint CropCanvas::InPicture(const wxPoint& place) const {
  const wxRect picture = PictureOnScreen();
  return {(place.x - picture.x) / Scale(), (place.y - picture.y) / Scale()};
}

// --- input ---

void CropCanvas::Changed() {
  Refresh();
  events_.changed();
}

void CropCanvas::OnMouse(wxMouseEvent& event) {
  const wxPoint place = event.GetPosition();
  if (event.LeftDown()) {
    SetFocus();
    if (!HasPicture()) return;
    from_ = to_ = place;
    grip_ = GripAtPoint(place);
    start_ = area_.Area();
    CaptureMouse();
    return;
  }
  if (!HasCapture()) {
    if (!drawsLevel_) SetCursor(wxCursor(CursorOf(GripAtPoint(place))));
    return;
  }
  to_ = place;
  const wxRealPoint from = InPicture(from_), to = InPicture(to_);
  if (event.LeftUp()) {
    ReleaseMouse();
    if (std::exchange(drawsLevel_, false)) {
      Refresh();
      return events_.levelDrawn(StraighteningAngle(from.x, from.y, to.x, to.y));
    }
    return;
  }
  if (drawsLevel_) return Refresh();
  if (grip_ != CropGrip::None) {
    area_.Drag(grip_, start_, to.x - from.x, to.y - from.y);
  } else if (!fixed_) {
    area_.Span(from.x, from.y, to.x, to.y);
  } else {
    return;
  }
  Changed();
}

void CropCanvas::OnKey(wxKeyEvent& event) {
  if (!HasPicture()) return event.Skip();
  const int step = event.ShiftDown() ? 10 : 1;
  int right = 0, down = 0;
  switch (event.GetKeyCode()) {
    case WXK_LEFT: right = -step; break;
    case WXK_RIGHT: right = step; break;
    case WXK_UP: down = -step; break;
    case WXK_DOWN: down = step; break;
    default: return event.Skip();
  }
  if (!event.ControlDown()) {
    area_.MoveBy(right, down);
  } else if (!fixed_) {
    const CropGrip grip = !area_.Ratio().Free() && right == 0 ? CropGrip::Bottom
                          : !area_.Ratio().Free()             ? CropGrip::Right
                                                              : CropGrip::BottomRight;
    area_.Drag(grip, area_.Area(), right, down);
  }
  Changed();
}

// --- painting ---

void CropCanvas::OnPaint(wxPaintEvent&) {
  wxPaintDC dc(this);
  const double scale = GetContentScaleFactor();
  const wxSize size = GetClientSize() * scale;
  if (size.x < 1 || size.y < 1) return;
  const Backdrop backdrop = BackdropFor(*this);
  RgbImage pixels = FilledImage(size.x, size.y, backdrop.around);
  if (HasPicture()) {
    const wxRect picture = PictureOnScreen();
    const auto device = [scale](int place) {
      return static_cast<int32_t>(std::lround(place * scale));
    };
    DrawPart({shown_->pixels.image, shown_->pixels.alpha},
             {device(picture.x), device(picture.y), device(picture.width), device(picture.height)},
             backdrop, Scale() < 2, pixels);
  }
  dc.DrawBitmap(BitmapOf(pixels, scale), 0, 0);
  if (HasPicture()) PaintRectangle(dc);
  PaintProblem(dc);
}

void CropCanvas::PaintRectangle(wxDC& paintDc) const {
  wxGCDC dc(static_cast<wxPaintDC&>(paintDc));
  const wxRect picture = PictureOnScreen(), shown = ShownArea();
  dc.SetPen(*wxTRANSPARENT_PEN);
  dc.SetBrush(wxBrush(wxColour(0, 0, 0, 140)));
  const int right = shown.x + shown.width, bottom = shown.y + shown.height;
  const int pictureRight = picture.x + picture.width, pictureBottom = picture.y + picture.height;
  dc.DrawRectangle(picture.x, picture.y, picture.width, shown.y - picture.y);
  dc.DrawRectangle(picture.x, bottom, picture.width, pictureBottom - bottom);
  dc.DrawRectangle(picture.x, shown.y, shown.x - picture.x, shown.height);
  dc.DrawRectangle(right, shown.y, pictureRight - right, shown.height);
  PaintLines(dc, shown);
  dc.SetBrush(*wxTRANSPARENT_BRUSH);
  dc.SetPen(wxPen(wxColour(0, 0, 0, 160), FromDIP(3)));
  dc.DrawRectangle(shown);
  dc.SetPen(wxPen(*wxWHITE, FromDIP(1)));
  dc.DrawRectangle(shown);
  if (drawsLevel_) {
    dc.SetPen(wxPen(wxColour(255, 200, 0), FromDIP(2)));
    if (from_ != to_) dc.DrawLine(from_, to_);
    return;
  }
  if (fixed_) return;
  dc.SetBrush(*wxWHITE_BRUSH);
  dc.SetPen(wxPen(wxColour(0, 0, 0, 160), FromDIP(1)));
  const int side = FromDIP(kHandle);
  for (const int x : {shown.x, shown.x + shown.width / 2, right}) {
    for (const int y : {shown.y, shown.y + shown.height / 2, bottom}) {
      if (x == shown.x + shown.width / 2 && y == shown.y + shown.height / 2) continue;
      dc.DrawRectangle(x - side / 2, y - side / 2, side, side);
    }
  }
}

void CropCanvas::PaintLines(wxDC& dc, const wxRect& shown) const {
  if (lines_ == CropLines::None) return;
  const double part = lines_ == CropLines::Thirds ? 1.0 / 3 : 2 - std::numbers::phi;
  for (const double place : {part, 1 - part}) {
    const int x = shown.x + static_cast<int>(std::lround(shown.width * place));
    const int y = shown.y + static_cast<int>(std::lround(shown.height * place));
    for (const auto& [color, width] :
         {std::pair{wxColour(0, 0, 0, 90), 3}, std::pair{wxColour(255, 255, 255, 170), 1}}) {
      dc.SetPen(wxPen(color, FromDIP(width)));
      dc.DrawLine(x, shown.y, x, shown.y + shown.height);
      dc.DrawLine(shown.x, y, shown.x + shown.width, y);
    }
  }
}

}  // namespace fotomill::desktop
