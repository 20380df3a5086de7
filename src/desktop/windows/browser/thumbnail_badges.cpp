#include "desktop/windows/browser/thumbnail_badges.h"

#include <cmath>
#include <numbers>

#include "desktop/models/browser/item_tags.h"

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

constexpr int kStar = 9;              // side, device-independent pixels
const wxColour kShade(0, 0, 0, 150);  // behind stars and label
const wxColour kGold(0xff, 0xcc, 0x33);

void DrawStar(wxDC& dc, double x, double y, double radius) {
  wxPoint points[10];
  for (int i = 0; i < 10; ++i) {
    const double reach = i % 2 == 0 ? radius : radius * 0.45, angle = i * std::numbers::pi / 5;
    points[i] = {static_cast<int>(std::lround(x + reach * std::sin(angle))),
                 static_cast<int>(std::lround(y - reach * std::cos(angle)))};
  }
  dc.DrawPolygon(10, points);
}

}  // namespace

void DrawTags(wxDC& dc, const wxWindow& window, const wxRect& square, const FolderItem& item) {
  const bool rejected = item.rating < 0;
  const int marks = rejected ? 1 : item.rating, side = window.FromDIP(kStar),
            gap = window.FromDIP(2);
  const int count = marks + (item.label.empty() ? 0 : 1);
  if (count == 0 || square.width < side * 4) return;
  const wxRect badge(square.x, square.GetBottom() + 1 - side - 2 * gap, count * (side + gap) + gap,
                     side + 2 * gap);
  dc.SetPen(*wxTRANSPARENT_PEN);
  dc.SetBrush(wxBrush(kShade));
  dc.DrawRoundedRectangle(badge, window.FromDIP(3));
  int x = badge.x + gap;
  const int y = badge.y + gap;
  dc.SetBrush(wxBrush(kGold));
  for (int i = 0; i < marks && !rejected; ++i, x += side + gap)
    DrawStar(dc, x + side / 2.0, y + side / 2.0, side / 2.0);
  if (rejected) {
    dc.SetPen(wxPen(*wxWHITE, window.FromDIP(2)));
    dc.DrawLine(x + 1, y + 1, x + side - 1, y + side - 1);
    dc.DrawLine(x + side - 2, y + 1, x, y + side - 1);
    dc.SetPen(*wxTRANSPARENT_PEN);
    x += side + gap;
  }
  if (item.label.empty()) return;
  dc.SetBrush(wxBrush(wxColour(static_cast<unsigned long>(LabelColor(item.label)))));
  dc.DrawRoundedRectangle(wxRect(x, y, side, side), window.FromDIP(2));
}

void DrawBadges(wxDC& dc, const wxWindow& window, const wxRect& picture, const Thumbnail& thumbnail,
                const wxColour& color, const wxColour& textColor) {
  if (thumbnail.alpha) DrawCheckerboard(dc, window, picture);
  if (thumbnail.partial) DrawMark(dc, window, picture, color, textColor);
  if (thumbnail.pages > 1) DrawPages(dc, window, picture, thumbnail, color, textColor);
}

}  // namespace fotomill::desktop
