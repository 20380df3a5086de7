#include "desktop/windows/browser/thumbnail_badges.h"

namespace fotomill::desktop {

namespace {

constexpr int kSquare = 4;  // of the checkerboard, device-independent pixels

void DrawPages(wxDC& dc, const wxWindow& window, const wxRect& picture, const Thumbnail& thumbnail,
               const wxColour& color, const wxColour& textColor) {
  const wxString pages = wxString::Format("%d", thumbnail.pages);
  const wxSize text = dc.GetTextExtent(pages);
  const int gap = window.FromDIP(4), side = thumbnail.animated ? text.y / 2 : 0;
  const wxSize size(text.x + 2 * gap + (side == 0 ? 0 : side + gap), text.y + window.FromDIP(2));
  const wxRect badge(wxPoint(picture.GetRight() + 1 - size.x, picture.GetBottom() + 1 - size.y),
                     size);
  dc.SetPen(*wxTRANSPARENT_PEN);
  dc.SetBrush(wxBrush(color));
  dc.DrawRoundedRectangle(badge, window.FromDIP(3));
  dc.SetTextForeground(textColor);
  dc.DrawText(pages, badge.GetRight() + 1 - gap - text.x, badge.y + (badge.height - text.y) / 2);
  if (side == 0) return;
  const int left = badge.x + gap, top = badge.y + (badge.height - side) / 2;
  const wxPoint triangle[] = {{left, top}, {left + side, top + side / 2}, {left, top + side}};
  dc.SetBrush(wxBrush(textColor));
  dc.DrawPolygon(3, triangle);
}

void DrawCheckerboard(wxDC& dc, const wxWindow& window, const wxRect& picture) {
  const int side = window.FromDIP(kSquare), edge = 3 * side;
  const wxRect badge(picture.x, picture.GetBottom() + 1 - edge, edge, edge);
  dc.SetPen(*wxTRANSPARENT_PEN);
  for (int i = 0; i < 9; ++i) {
    dc.SetBrush(i % 2 == 0 ? *wxWHITE_BRUSH : *wxGREY_BRUSH);
    dc.DrawRectangle(badge.x + i % 3 * side, badge.y + i / 3 * side, side, side);
  }
  dc.SetPen(*wxBLACK_PEN);
  dc.SetBrush(*wxTRANSPARENT_BRUSH);
  dc.DrawRectangle(badge);
}

// For incomplete pictures.
void DrawMark(wxDC& dc, const wxWindow& window, const wxRect& picture, const wxColour& color,
              const wxColour& textColor) {
  const wxString mark("!");
  const wxSize text = dc.GetTextExtent(mark);
  const wxRect badge(picture.x, picture.y, text.x + 2 * window.FromDIP(5),
                     text.y + window.FromDIP(2));
  dc.SetPen(*wxTRANSPARENT_PEN);
  dc.SetBrush(wxBrush(color));
  dc.DrawRoundedRectangle(badge, window.FromDIP(3));
  dc.SetTextForeground(textColor);
  dc.DrawText(mark, badge.x + (badge.width - text.x) / 2, badge.y + (badge.height - text.y) / 2);
}

}  // namespace

void DrawBadges(wxDC& dc, const wxWindow& window, const wxRect& picture, const Thumbnail& thumbnail,
                const wxColour& color, const wxColour& textColor) {
  if (thumbnail.alpha) DrawCheckerboard(dc, window, picture);
  if (thumbnail.partial) DrawMark(dc, window, picture, color, textColor);
  if (thumbnail.pages > 1) DrawPages(dc, window, picture, thumbnail, color, textColor);
}

}  // namespace fotomill::desktop
