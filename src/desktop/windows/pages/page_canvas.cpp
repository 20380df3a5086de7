#include "desktop/windows/pages/page_canvas.h"

#include <wx/dcbuffer.h>
#include <wx/image.h>
#include <wx/settings.h>

#include <algorithm>
#include <cmath>
#include <cstring>
#include <utility>

#include "desktop/models/view/view_transform.h"
#include "desktop/windows/widgets/looks.h"

namespace fotomill::desktop {

namespace {

constexpr int kBorder = 16;  // around the sheet
constexpr int kShadow = 3;
constexpr int kGround = 80, kShade = 70;  // lightness in percent

wxBitmap BitmapOf(const RgbImage& image, double scale) {
  wxImage copy(image.width, image.height, false);
  std::memcpy(copy.GetData(), image.bytes.data(), image.bytes.size());
  return wxBitmap(copy, wxBITMAP_SCREEN_DEPTH, scale);
}

}  // namespace

PageCanvas::PageCanvas(wxWindow* parent, std::function<void()> zoomed)
    : wxScrolledCanvas(parent, wxID_ANY, wxDefaultPosition, wxDefaultSize,
                       wxHSCROLL | wxVSCROLL | wxWANTS_CHARS | wxFULL_REPAINT_ON_RESIZE,
                       "PageCanvas"),
      zoomed_(std::move(zoomed)) {
  SetBackgroundStyle(wxBG_STYLE_PAINT);
  SetMinSize(FromDIP(wxSize(200, 200)));
  SetScrollRate(FromDIP(8), FromDIP(8));
  Bind(wxEVT_PAINT, &PageCanvas::OnPaint, this);
  for (const auto& type : {wxEVT_LEFT_DOWN, wxEVT_LEFT_UP, wxEVT_MOTION, wxEVT_LEFT_DCLICK})
    Bind(type, &PageCanvas::OnMouse, this);
  Bind(wxEVT_MOUSEWHEEL, [this](wxMouseEvent& event) {
    if (!event.ControlDown()) return event.Skip();
    const double steps =
        static_cast<double>(event.GetWheelRotation()) / std::max(event.GetWheelDelta(), 1);
    ZoomBy(std::pow(ViewTransform::kStep, steps));
  });
  Bind(wxEVT_SIZE, [this](wxSizeEvent& event) {
    event.Skip();
    if (std::exchange(pane_, GetSize()) == GetSize()) return;  // only scroll bars came or went
    zoomed_();
  });
  for (const auto& type : {wxEVT_SET_FOCUS, wxEVT_KILL_FOCUS})
    Bind(type, [this](wxFocusEvent& event) {
      Refresh();
      event.Skip();
    });
}

wxSize PageCanvas::PaneSize() const {
  const wxSize size = GetSize() - FromDIP(wxSize(2 * kBorder, 2 * kBorder));
  const double scale = GetContentScaleFactor();
  return {std::max(16, static_cast<int>(size.x * scale)),
          std::max(16, static_cast<int>(size.y * scale))};
}

void PageCanvas::Show(PageViewPointer view) {
  view_ = std::move(view);
  text_.clear();
  sheet_ = view_ == nullptr || view_->image.Empty()
               ? wxBitmap()
               : BitmapOf(view_->image, GetContentScaleFactor());
  SizeSheet();
  Refresh();
}

void PageCanvas::ShowText(const wxString& text) {
  Show(nullptr);
  text_ = text;
}

void PageCanvas::SetZoom(double zoom) {
  const double wanted = std::clamp(zoom, 1.0, kLargestZoom);
  if (std::exchange(zoom_, wanted) != wanted) zoomed_();
}

wxSize PageCanvas::SheetSize() const {
  return sheet_.IsOk() ? wxSize(static_cast<int>(sheet_.GetLogicalWidth()),
                                static_cast<int>(sheet_.GetLogicalHeight()))
                       : wxSize();
}

void PageCanvas::SizeSheet() {
  const int border = 2 * FromDIP(kBorder);
  const wxSize sheet = SheetSize();
  SetVirtualSize(zoom_ == 1 ? wxSize(1, 1) : sheet + wxSize(border, border));
}

void PageCanvas::OnPaint(wxPaintEvent&) {
  wxAutoBufferedPaintDC dc(this);
  const wxSize client = GetClientSize();
  const wxColour ground =
      wxSystemSettings::GetColour(wxSYS_COLOUR_BTNFACE).ChangeLightness(kGround);
  dc.SetBackground(wxBrush(ground));
  dc.Clear();
  if (!text_.empty()) {
    dc.SetFont(GetFont());
    dc.SetTextForeground(wxSystemSettings::GetColour(wxSYS_COLOUR_BTNTEXT));
    dc.DrawLabel(text_, wxRect(client).Deflate(FromDIP(kBorder)), wxALIGN_CENTER);
  }
  const wxSize sheet = SheetSize();
  if (sheet.x > 0) {
    const wxSize whole = GetVirtualSize();
    wxPoint place((std::max(whole.x, client.x) - sheet.x) / 2,
                  (std::max(whole.y, client.y) - sheet.y) / 2);
    place = CalcScrolledPosition(place);
    const int shadow = FromDIP(kShadow);
    dc.SetPen(*wxTRANSPARENT_PEN);
    dc.SetBrush(wxBrush(ground.ChangeLightness(kShade)));
    dc.DrawRectangle(place.x + shadow, place.y + shadow, sheet.x, sheet.y);
    dc.DrawBitmap(sheet_, place);
  }
  if (HasFocus()) {
    dc.SetPen(wxPen(wxSystemSettings::GetColour(wxSYS_COLOUR_HIGHLIGHT), FromDIP(2)));
    dc.SetBrush(*wxTRANSPARENT_BRUSH);
    dc.DrawRectangle(wxRect(client).Deflate(FromDIP(1)));
  }
}

void PageCanvas::OnMouse(wxMouseEvent& event) {
  if (event.LeftDClick()) return SetZoom(zoom_ == 1 ? 2 : 1);
  if (event.LeftDown()) {
    SetFocus();
    drag_ = event.GetPosition();
    dragStart_ = GetViewStart();
    if (!HasCapture()) CaptureMouse();
  } else if (event.LeftUp()) {
    if (HasCapture()) ReleaseMouse();
  } else if (event.Dragging() && HasCapture()) {
    const wxPoint by = drag_ - event.GetPosition();
    const int unit = FromDIP(8);
    Scroll(dragStart_ + wxPoint(by.x / unit, by.y / unit));
  }
}

}  // namespace fotomill::desktop
