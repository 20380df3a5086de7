#pragma once

#include <functional>

#include "desktop/models/drawing/rgb_image.h"
#include "desktop/models/edit/preview_maker.h"
#include "desktop/models/view/view_drawing.h"
#include "desktop/windows/edit/edit_canvas.h"

namespace fotomill::desktop {

// How an Edit window shows the picture before and after.
enum class PreviewMode { After, Split, Sides };

// Shows previews: zoomed with wheel and double click, moved by dragging. In split mode, a line that
// can be dragged separates the original on its left from the result.
class PreviewCanvas : public EditCanvas {
 public:
  // `placed` is called after another zoom, position or size, to request previews.
  PreviewCanvas(wxWindow* parent, std::function<void()> placed);

  void StartAfresh();  // another picture
  void Take(PreviewPointer preview);
  void SetMode(PreviewMode mode);
  PreviewMode Mode() const { return mode_; }
  void ShowOriginal(bool show);  // while a key or button is held
  bool ShowsOriginal() const { return original_ || mode_ != PreviewMode::After; }

  void ZoomBy(double factor);
  void SetZoom(ZoomMode mode);
  void ZoomActual();  // one screen pixel per pixel
  double Zoom() const { return transform_.Scale(); }
  ViewPlace Place() const { return transform_.Place(); }
  wxSize PaneSize() const;  // device pixels
  // The latest result as a whole; null before the first one.
  const PreviewPointer& Result() const { return after_.whole; }

 private:
  // The latest previews: of the whole picture, and exact ones of a part.
  struct Layers {
    PreviewPointer whole, part;
  };
  void OnPaint(wxPaintEvent&);
  void OnMouse(wxMouseEvent& event);
  void OnWheel(wxMouseEvent& event);
  void Draw(const Layers& layers, const ViewTransform& transform, RgbImage& pixels) const;
  ViewTransform TransformOf(const Layers& layers) const;
  void PaintDivider(wxDC& dc) const;
  bool NearSplit(const wxPoint& place) const;
  void Placed();
  double DeviceScale() const { return GetContentScaleFactor(); }

  const std::function<void()> placed_;
  Layers before_, after_;
  ViewTransform transform_;  // of the result in its pane
  PreviewMode mode_ = PreviewMode::After;
  bool original_ = false;
  double split_ = 0.5;  // position of the line, a fraction of the width
  bool movesSplit_ = false;
  wxPoint drag_;
};

}  // namespace fotomill::desktop
