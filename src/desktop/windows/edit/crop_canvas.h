#pragma once

#include <functional>

#include "desktop/models/edit/crop_area.h"
#include "desktop/models/edit/preview_maker.h"
#include "desktop/windows/edit/edit_canvas.h"

namespace fotomill::desktop {

// Lines inside a crop rectangle.
enum class CropLines { None, Thirds, Golden };

// Shows a picture with its crop rectangle: dragged by its edges, corners and inside, or spanned
// anew outside of it. Arrow keys move it by a pixel, with Shift by ten, with Ctrl its lower right
// corner moves.
class CropCanvas : public EditCanvas {
 public:
  struct Events {
    std::function<void()> changed;                 // the rectangle
    std::function<void()> resized;                 // another pane size: request previews
    std::function<void(double angle)> levelDrawn;  // a line was drawn along the horizon
  };
  // `area` must outlive the canvas.
  CropCanvas(wxWindow* parent, CropArea& area, Events events);

  void StartAfresh();  // another picture
  void Take(PreviewPointer preview);
  bool HasPicture() const { return shown_ != nullptr && Problem().empty(); }
  void SetLines(CropLines lines);
  void SetFixedSize(bool fixed) { fixed_ = fixed; }  // the rectangle can only be moved
  void DrawLevel(bool draw);                         // the next drag draws a line along the horizon
  wxSize PaneSize() const;                           // device pixels, which the picture fits

 private:
  void OnPaint(wxPaintEvent&);
  void OnMouse(wxMouseEvent& event);
  void OnKey(wxKeyEvent& event);
  void PaintRectangle(wxDC& dc) const;
  void PaintLines(wxDC& dc, const wxRect& shown) const;
  wxRect PictureOnScreen() const;
  double Scale() const;      // window pixels per picture pixel
  wxRect ShownArea() const;  // the rectangle in the window
  CropGrip GripAtPoint(const wxPoint& place) const;
  wxRealPoint InPicture(const wxPoint& place) const;
  void Changed();

  const Events events_;
  CropArea& area_;
  PreviewPointer shown_;
  CropLines lines_ = CropLines::Thirds;
  bool fixed_ = false, drawsLevel_ = false;
  CropGrip grip_ = CropGrip::None;
  Rectangle start_;    // of the rectangle being dragged
  wxPoint from_, to_;  // of the drag
};

}  // namespace fotomill::desktop
