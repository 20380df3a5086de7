#pragma once

#include <wx/scrolwin.h>

#include <functional>
#include <string>
#include <vector>

#include "desktop/models/browser/cell_layout.h"
#include "desktop/models/similar/group_list.h"
#include "desktop/windows/similar/group_thumbnails.h"

namespace fotomill::desktop {

struct ListPalette;

// Groups of similar pictures: thumbnails side by side, with their facts and a box to tick.
class GroupCanvas : public wxScrolledCanvas {
 public:
  struct Events {
    std::function<void()> changed;  // focus or ticks
    std::function<void()> view;     // the focused picture
    std::function<void(const wxPoint& place)> menu;
  };

  GroupCanvas(wxWindow* parent, GroupList& list, Events events);

  // The groups, their order or their states have changed; keeps the focused picture.
  void ListChanged();
  // Shown in place of groups.
  void SetNote(const wxString& note);
  size_t Focus() const { return focus_; }  // a cell; kNoLine if there are none
  void FocusCell(size_t cell);
  void TickFocused(bool ticked);  // beeps if that is impossible

 private:
  void BindEvents();
  void Measure();
  void OnPaint(wxPaintEvent&);
  void DrawCell(wxDC& dc, size_t cell, const ListPalette& palette);
  void DrawPicture(wxDC& dc, size_t cell, const wxRect& square, const ListPalette& palette);
  void DrawTexts(wxDC& dc, size_t cell, const wxRect& square, const ListPalette& palette);
  void DrawHeadings(wxDC& dc, const ListPalette& palette);
  void OnMouseDown(wxMouseEvent& event);
  void OnMouseMove(wxMouseEvent& event);
  void OnKey(wxKeyEvent& event);
  void OnSize(wxSizeEvent& event);
  void WantThumbnails();
  void ReportFocus();
  int Top() const;  // scroll position
  size_t CellAt(const wxPoint& place) const;
  wxRect SquareOf(size_t cell) const;  // on the screen
  wxRect BoxOf(size_t cell) const;     // to be ticked

  GroupList& list_;
  const Events events_;
  CellLayout layout_;
  size_t focus_ = kNoLine;
  std::string focusPath_;
  wxString note_;
  int textHeight_ = 0;
  GroupThumbnails thumbnails_;
};

}  // namespace fotomill::desktop
