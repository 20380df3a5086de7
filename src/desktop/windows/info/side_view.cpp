#include "desktop/windows/info/side_view.h"

#include <wx/dcclient.h>
#include <wx/graphics.h>
#include <wx/menu.h>

#include <algorithm>
#include <memory>

#include "desktop/models/drawing/wrapped_text.h"
#include "desktop/models/shell/event_log.h"
#include "desktop/windows/info/text_actions.h"
#include "desktop/windows/widgets/bitmaps.h"
#include "desktop/windows/widgets/looks.h"
#include "desktop/windows/widgets/screen_reader.h"
#include "desktop/windows/widgets/text_sizes.h"
#include "desktop/windows/widgets/wx_text.h"

namespace fotomill::desktop {

namespace {

// in device-independent pixels
constexpr int kMargin = 12, kGap = 10, kLevelsHeight = 72, kScrollStep = 16;

}  // namespace

SideView::SideView(wxWindow* parent, std::function<void()> activated)
    : activated_(std::move(activated)) {
  SetBackgroundStyle(wxBG_STYLE_PAINT);
  Create(parent, wxID_ANY, wxDefaultPosition, wxDefaultSize, wxVSCROLL | wxBORDER_NONE,
         Label("Side pane"));
  SetFont(FontOf(*this, TextSize::Normal));
  SetScrollRate(0, FromDIP(kScrollStep));
  Bind(wxEVT_PAINT, &SideView::OnPaint, this);
  Bind(wxEVT_SIZE, [this](wxSizeEvent& event) {
    if (ContentWidth() != width_) Arrange();
    event.Skip();
  });
  Bind(wxEVT_DPI_CHANGED, [this](wxDPIChangedEvent& event) { Arrange(), event.Skip(); });
  Bind(wxEVT_SYS_COLOUR_CHANGED, [this](wxSysColourChangedEvent& event) {
    Refresh();
    event.Skip();
  });
  for (const auto& type : {wxEVT_SET_FOCUS, wxEVT_KILL_FOCUS})
    Bind(type, [this](wxFocusEvent& event) { Refresh(), event.Skip(); });
  Bind(wxEVT_LEFT_DCLICK, [this](wxMouseEvent&) { activated_(); });
  Bind(wxEVT_CONTEXT_MENU, [this](wxContextMenuEvent&) { ShowMenu(); });
}

void SideView::ShowHint(const wxString& hint) {
  report_ = {};
  hint_ = hint;
  ready_ = false;
  Changed();
}

void SideView::ShowStandIn(const std::string& name, const RgbImage& thumbnail, bool folder) {
  report_ = {};
  report_.name = name;
  report_.preview = thumbnail;
  folder_ = folder;
  ready_ = false;
  hint_.clear();
  Changed();
}

void SideView::ShowReport(SideReport report) {
  // keep a thumbnail if there is no better picture
  if (report.preview.Empty()) std::swap(report.preview, report_.preview);
  report_ = std::move(report);
  ready_ = true;
  Changed();
}

int SideView::PreviewSide() const {
  return std::max(static_cast<int>(ContentWidth() * GetContentScaleFactor()), 64);
}

// Also without a scrollbar, so that previews keep their size.
int SideView::ContentWidth() const { return GetSize().x - 2 * FromDIP(kMargin); }

void SideView::Changed() {
  preview_ = BitmapOf(report_.preview, 1);
  Arrange();
  Scroll(0, 0);
  ReportToScreenReader(*this, Label("Side pane"), hint_.empty() ? Shown(report_.Text()) : hint_);
}

// --- layout ---

void SideView::Arrange() {
  width_ = ContentWidth();
  pieces_.clear();
  bottom_ = FromDIP(kMargin);
  if (width_ < FromDIP(40)) return Refresh();
  if (!hint_.empty()) {
    AddText(Utf8(hint_), &ListPalette::note, false);
  } else {
    if (!folder_ && !(ready_ && report_.preview.Empty())) {
      const int height = std::min(width_ * 3 / 4, std::max(GetSize().y / 2, FromDIP(100)));
      pieces_.push_back({Piece::Preview, wxRect(FromDIP(kMargin), bottom_, width_, height)});
      bottom_ += height + FromDIP(kGap);
    }
    AddText(report_.name, &ListPalette::text, true);
    AddText(report_.remark, &ListPalette::fault, false);
    AddText(report_.RatingText(), &ListPalette::text, true);
    AddLines(report_.facts, &ListPalette::text);
    AddText(report_.comment, &ListPalette::text, false);
    AddLines(report_.tags, &ListPalette::text);
    if (ready_ && report_.histogram != Histogram()) {
      const wxRect place(FromDIP(kMargin), bottom_, width_, FromDIP(kLevelsHeight));
      pieces_.push_back({Piece::Levels, place});
      bottom_ += place.height + FromDIP(kGap);
    }
    AddLines(report_.photo, &ListPalette::text);
  }
  SetVirtualSize(-1, bottom_);
  Refresh();
}

void SideView::AddText(const std::string& text, Shade ListPalette::*color, bool bold) {
  if (text.empty()) return;
  wxFont font = GetFont();
  if (bold) font.MakeBold();
  const auto widthOf = [&](const std::string& line) {
    int width = 0;
    GetTextExtent(Shown(line), &width, nullptr, nullptr, nullptr, &font);
    return width;
  };
  wxString shown;
  int lines = 0;
  for (const std::string& line :
       WrapText(text, [&](const std::string& part) { return widthOf(part) <= width_; })) {
    shown += (lines++ == 0 ? "" : "\n") + Shown(line);
  }
  const int height = lines * (GetCharHeight() + FromDIP(3));
  pieces_.push_back(
      {Piece::Text, wxRect(FromDIP(kMargin), bottom_, width_, height), shown, color, bold});
  bottom_ += height + FromDIP(kGap);
}

void SideView::AddLines(const std::vector<std::string>& lines, Shade ListPalette::*color) {
  std::string text;
  for (const std::string& line : lines) text.append(text.empty() ? "" : "\n").append(line);
  AddText(text, color, false);
}

// --- painting ---

void SideView::OnPaint(wxPaintEvent&) {
  wxPaintDC dc(this);
  DoPrepareDC(dc);
  const ListPalette palette = CurrentPalette();
  dc.SetBackground(wxBrush(ToWx(palette.background)));
  dc.Clear();
  for (const Piece& piece : pieces_) Draw(dc, piece, palette);
  if (!HasFocus()) return;
  dc.SetDeviceOrigin(0, 0);
  dc.SetPen(wxPen(ToWx(palette.selected), FromDIP(1)));
  dc.SetBrush(*wxTRANSPARENT_BRUSH);
  dc.DrawRectangle(wxRect(GetClientSize()));
}

void SideView::Draw(wxDC& dc, const Piece& piece, const ListPalette& palette) {
  switch (piece.kind) {
    case Piece::Preview: return DrawPreview(dc, piece.place, palette);
    case Piece::Levels: {
      const RgbImage pixels =
          HistogramPixels(report_.histogram, piece.place.width, piece.place.height, palette.faint);
      if (const wxBitmap bitmap = BitmapOf(pixels); bitmap.IsOk())
        dc.DrawBitmap(bitmap, piece.place.GetTopLeft());
      return;
    }
    case Piece::Text: break;
  }
  wxFont font = GetFont();
  if (piece.bold) font.MakeBold();
  dc.SetFont(font);
  dc.SetTextForeground(ToWx(palette.*piece.color));
  int y = piece.place.y;
  for (const wxString& line : wxSplit(piece.text, '\n', '\0')) {
    dc.DrawText(line, piece.place.x, y);
    y += GetCharHeight() + FromDIP(3);
  }
}

void SideView::DrawPreview(wxDC& dc, const wxRect& place, const ListPalette& palette) {
  if (!preview_.IsOk()) {
    dc.SetPen(*wxTRANSPARENT_PEN);
    dc.SetBrush(wxBrush(ToWx(palette.faint)));
    dc.DrawRectangle(place);
    return;
  }
  const double largest = ready_ ? 1 / GetContentScaleFactor() : 1000;  // enlarges only stand-ins
  const double scale =
      std::min({static_cast<double>(place.width) / preview_.GetWidth(),
                static_cast<double>(place.height) / preview_.GetHeight(), largest});
  const double width = preview_.GetWidth() * scale, height = preview_.GetHeight() * scale;
  const std::unique_ptr<wxGraphicsContext> context(wxGraphicsContext::CreateFromUnknownDC(dc));
  if (context == nullptr) return;
  context->SetInterpolationQuality(wxINTERPOLATION_GOOD);
  context->DrawBitmap(preview_, place.x + (place.width - width) / 2,
                      place.y + (place.height - height) / 2, width, height);
}

void SideView::ShowMenu() {
  if (!ready_) return;
  wxMenu menu;
  menu.Append(wxID_COPY, Label("&Copy facts"));
  if (GetPopupMenuSelectionFromUser(menu) != wxID_COPY) return;
  CopyText(Shown(report_.Text()));
  LogEvent("side-copied");
}

}  // namespace fotomill::desktop
