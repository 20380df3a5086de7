#include "desktop/windows/shell/flat_tab_art.h"

#include <wx/control.h>
#include <wx/dc.h>
#include <wx/settings.h>

#include <algorithm>

namespace fotomill::desktop {

namespace {

// Device-independent pixels.
constexpr int kMargin = 12, kGap = 8, kCross = 8, kLine = 3, kLongestText = 220;

wxColour SystemColor(wxSystemColour which) { return wxSystemSettings::GetColour(which); }

void Fill(wxDC& dc, const wxRect& rect, const wxColour& color) {
  dc.SetPen(*wxTRANSPARENT_PEN);
  dc.SetBrush(wxBrush(color));
  dc.DrawRectangle(rect);
}

void DrawCross(wxDC& dc, const wxWindow& window, const wxRect& button, int state) {
  if ((state & (wxAUI_BUTTON_STATE_HOVER | wxAUI_BUTTON_STATE_PRESSED)) != 0)
    Fill(dc, button, SystemColor(wxSYS_COLOUR_BTNSHADOW));
  const int half = window.FromDIP(kCross) / 2;
  const wxPoint middle(button.x + button.width / 2, button.y + button.height / 2);
  dc.SetPen(wxPen(SystemColor(wxSYS_COLOUR_BTNTEXT), window.FromDIP(1)));
  dc.DrawLine(middle.x - half, middle.y - half, middle.x + half, middle.y + half);
  dc.DrawLine(middle.x - half, middle.y + half, middle.x + half, middle.y - half);
}

}  // namespace

void FlatTabArt::DrawBackground(wxDC& dc, wxWindow* window, const wxRect& rect) {
  Fill(dc, rect, SystemColor(wxSYS_COLOUR_BTNFACE));
  const int line = window->FromDIP(1);
  Fill(dc, wxRect(rect.x, rect.GetBottom() - line + 1, rect.width, line),
       SystemColor(wxSYS_COLOUR_BTNSHADOW));
}

wxSize FlatTabArt::GetTabSize(wxDC& dc, wxWindow* window, const wxString& caption,
                              const wxBitmapBundle&, bool, int closeState, int* extent) {
  dc.SetFont(window->GetFont());
  const wxSize text = dc.GetTextExtent(caption);
  int width =
      std::min(text.x, window->FromDIP(kLongestText)) + 2 * window->FromDIP(kMargin);
  if (closeState != wxAUI_BUTTON_STATE_HIDDEN) width += window->FromDIP(kGap + kCross);
  *extent = width;
  return {width, text.y + window->FromDIP(kMargin)};
}

void FlatTabArt::DrawTab(wxDC& dc, wxWindow* window, const wxAuiNotebookPage& page,
                         const wxRect& place, int closeState, wxRect* tab, wxRect* button,
                         int* extent) {
  const wxSize size =
      GetTabSize(dc, window, page.caption, page.bitmap, page.active, closeState, extent);
  *tab = wxRect(place.x, place.y, std::min(size.x, place.GetRight() - place.x + 1), place.height);
  const wxDCClipper clip(dc, *tab);
  const int margin = window->FromDIP(kMargin), line = window->FromDIP(kLine);
  if (page.active) {
    Fill(dc, wxRect(tab->x, tab->GetBottom() - line + 1, tab->width, line),
         SystemColor(wxSYS_COLOUR_HIGHLIGHT));
  }
  dc.SetTextForeground(SystemColor(wxSYS_COLOUR_BTNTEXT));
  const wxString text =
      wxControl::Ellipsize(page.caption, dc, wxELLIPSIZE_MIDDLE, window->FromDIP(kLongestText));
  dc.DrawText(text, tab->x + margin, tab->y + (tab->height - dc.GetCharHeight()) / 2);
  if (closeState == wxAUI_BUTTON_STATE_HIDDEN) return;
  const int side = window->FromDIP(kCross + kGap);
  *button = wxRect(tab->x + size.x - margin / 2 - side, tab->y + (tab->height - side) / 2, side,
                   side);
  DrawCross(dc, *window, *button, closeState);
}

}  // namespace fotomill::desktop
