#include "desktop/windows/edit/picture_strip.h"

#include <wx/dcbuffer.h>
#include <wx/settings.h>

#include <algorithm>
#include <cmath>

#include "desktop/windows/widgets/looks.h"
#include "desktop/windows/widgets/screen_reader.h"
#include "desktop/windows/widgets/wx_text.h"
#include "platform/paths.h"

namespace fotomill::desktop {

namespace {

constexpr int kThumbnail = 64, kMargin = 6;

}  // namespace

PictureStrip::PictureStrip(wxWindow* parent, const std::vector<std::string>& files,
                           std::function<void(size_t place)> chosen)
    : wxScrolledCanvas(parent, wxID_ANY, wxDefaultPosition, wxDefaultSize,
                       wxHSCROLL | wxWANTS_CHARS | wxBORDER_NONE, Label("Pictures")),
      files_(files),
      chosen_(std::move(chosen)),
      thumbnails_([this](const std::vector<std::string>&) { Refresh(); }) {
  SetBackgroundStyle(wxBG_STYLE_PAINT);
  SetVirtualSize(CellWidth() * static_cast<int>(files_.size()), FromDIP(kThumbnail + 2 * kMargin));
  SetScrollRate(CellWidth(), 0);
  SetMinSize(wxSize(FromDIP(160), FromDIP(kThumbnail + 2 * kMargin) + FromDIP(16)));
  Bind(wxEVT_PAINT, &PictureStrip::OnPaint, this);
  Bind(wxEVT_LEFT_DOWN, &PictureStrip::OnMouse, this);
  Bind(wxEVT_MOTION, &PictureStrip::OnMouse, this);
  Bind(wxEVT_KEY_DOWN, &PictureStrip::OnKey, this);
  for (const auto type : {wxEVT_SET_FOCUS, wxEVT_KILL_FOCUS}) {
    Bind(type, [this](wxFocusEvent& event) {
      Refresh();
      event.Skip();
    });
  }
  ReportToScreenReader(*this, Label("Pictures"), Shown(platform::FileNameOf(files_.front())));
}

void PictureStrip::Choose(size_t place) {
  if (place >= files_.size()) return;
  place_ = place;
  ScrollTo(place);
  Refresh();
  ReportToScreenReader(*this, Label("Pictures"), Shown(platform::FileNameOf(files_[place])));
  chosen_(place);
}

void PictureStrip::Mark(size_t place, bool done) {
  if (done) {
    marks_.insert(place);
  } else {
    marks_.erase(place);
  }
  Refresh();
}

void PictureStrip::ScrollTo(size_t place) {
  int first = 0, unused = 0;
  GetViewStart(&first, &unused);
  const int visible = std::max(GetClientSize().x / CellWidth(), 1);
  const int cell = static_cast<int>(place);
  if (cell < first) Scroll(cell, 0);
  if (cell >= first + visible) Scroll(cell - visible + 1, 0);
}

// Only thumbnails on the screen are loaded.
void PictureStrip::WantVisible() {
  int first = 0, unused = 0;
  GetViewStart(&first, &unused);
  const auto from = static_cast<size_t>(first);
  const size_t to =
      std::min(files_.size(), from + static_cast<size_t>(GetClientSize().x / CellWidth()) + 2);
  const std::vector<std::string> shown(files_.begin() + static_cast<std::ptrdiff_t>(from),
                                       files_.begin() + static_cast<std::ptrdiff_t>(to));
  const double scale = GetContentScaleFactor();
  thumbnails_.Want(shown, static_cast<int>(std::lround(FromDIP(kThumbnail) * scale)), scale);
}

void PictureStrip::OnPaint(wxPaintEvent&) {
  WantVisible();
  wxAutoBufferedPaintDC dc(this);
  DoPrepareDC(dc);
  const ListPalette palette = CurrentPalette();
  dc.SetBackground(wxBrush(ToWx(palette.background)));
  dc.Clear();
  int first = 0, unused = 0;
  GetViewStart(&first, &unused);
  const auto last = static_cast<size_t>(first + GetClientSize().x / CellWidth() + 2);
  for (auto i = static_cast<size_t>(first); i < std::min(files_.size(), last); ++i) {
    const wxRect cell(static_cast<int>(i) * CellWidth(), 0, CellWidth(),
                      FromDIP(kThumbnail + 2 * kMargin));
    if (i == place_) {
      dc.SetPen(*wxTRANSPARENT_PEN);
      dc.SetBrush(wxBrush(ToWx(HasFocus() ? palette.selected : palette.resting)));
      dc.DrawRectangle(cell);
    }
    const wxBitmapBundle& thumbnail = thumbnails_.Find(files_[i]);
    const wxPoint at(cell.x + (CellWidth() - FromDIP(kThumbnail)) / 2, FromDIP(kMargin));
    if (thumbnail.IsOk()) dc.DrawBitmap(thumbnail.GetBitmapFor(this), at, true);
    if (!marks_.contains(i)) continue;
    dc.SetPen(wxPen(*wxWHITE, FromDIP(1)));
    dc.SetBrush(wxBrush(wxColour(46, 125, 50)));
    const wxPoint center(cell.GetRight() - FromDIP(12), FromDIP(14));
    dc.DrawCircle(center, FromDIP(8));
    dc.SetPen(wxPen(*wxWHITE, FromDIP(2)));
    dc.DrawLine(center.x - FromDIP(4), center.y, center.x - FromDIP(1), center.y + FromDIP(3));
    dc.DrawLine(center.x - FromDIP(1), center.y + FromDIP(3), center.x + FromDIP(4),
                center.y - FromDIP(3));
  }
}

void PictureStrip::OnMouse(wxMouseEvent& event) {
  const int x = CalcUnscrolledPosition(event.GetPosition()).x;
  const auto place = static_cast<size_t>(std::max(x, 0) / CellWidth());
  if (place >= files_.size()) return;
  if (event.LeftDown()) {
    SetFocus();
    if (place != place_) Choose(place);
  }
  const wxString name = Shown(platform::FileNameOf(files_[place]));
  if (GetToolTipText() != name) SetToolTip(name);
}

void PictureStrip::OnKey(wxKeyEvent& event) {
  const size_t last = files_.size() - 1;
  switch (event.GetKeyCode()) {
    case WXK_LEFT: return place_ > 0 ? Choose(place_ - 1) : void();
    case WXK_RIGHT: return place_ < last ? Choose(place_ + 1) : void();
    case WXK_HOME: return Choose(0);
    case WXK_END: return Choose(last);
    case WXK_TAB:
      Navigate(event.ShiftDown() ? wxNavigationKeyEvent::IsBackward
                                 : wxNavigationKeyEvent::IsForward);
      return;
    default: event.Skip();
  }
}

}  // namespace fotomill::desktop
