#pragma once

#include <wx/bitmap.h>
#include <wx/scrolwin.h>

#include <functional>

#include "desktop/models/pages/page_preview.h"

namespace fotomill::desktop {

// Shows a page as a sheet of paper; larger ones are scrolled, also by dragging.
class PageCanvas : public wxScrolledCanvas {
 public:
  static constexpr double kLargestZoom = 8;

  // `zoomed`: another size or zoom, request the page again.
  PageCanvas(wxWindow* parent, std::function<void()> zoomed);

  void Show(PageViewPointer view);      // null: no page
  void ShowText(const wxString& text);  // instead of a page; empty: none
  void SetZoom(double zoom);            // 1: the page fits
  void ZoomBy(double factor) { SetZoom(zoom_ * factor); }
  double Zoom() const { return zoom_; }
  wxSize PaneSize() const;  // room for a page that fits, in device pixels
  // The page in view; null if there is none.
  const PageViewPointer& View() const { return view_; }

 private:
  void OnPaint(wxPaintEvent&);
  void OnMouse(wxMouseEvent& event);
  wxSize SheetSize() const;  // in the window's units
  void SizeSheet();

  const std::function<void()> zoomed_;
  PageViewPointer view_;
  wxBitmap sheet_;
  wxString text_;
  double zoom_ = 1;
  wxSize pane_;
  wxPoint drag_, dragStart_;
};

}  // namespace fotomill::desktop
