#pragma once

#include <wx/bitmap.h>
#include <wx/window.h>

#include <functional>
#include <memory>
#include <string>
#include <vector>

#include "desktop/models/view/view_drawing.h"
#include "desktop/models/view/view_picture.h"
#include "desktop/models/view/view_transform.h"
#include "desktop/windows/widgets/window_calls.h"

namespace fotomill::desktop {

// Shows a picture: zoomed with keys, wheel and double click, moved by dragging, scaled on a
// background thread. The window chooses the picture.
class ViewCanvas : public wxWindow {
 public:
  // Callbacks to the window. Keys, right clicks and
  // pointer movements are events of the canvas.
  struct Events {
    std::function<void()> resized;           // pictures need another size
    std::function<void()> changed;           // another picture or zoom
    std::function<void()> painted;           // a picture, not its stand-in
    std::function<void()> placed = nullptr;  // zoomed or moved by the user
    // draws on top of the picture
    std::function<void(wxDC& dc)> decorate = nullptr;
  };

  // The callbacks are called on the window's thread while the canvas exists.
  ViewCanvas(wxWindow* parent, Events events);
  ~ViewCanvas() override;

  // Shows a picture, or the reason why it could not be loaded.
  void Show(ViewPicturePointer picture);
  // Shows another frame of an animation at the same position. While playing, quality is traded for
  // speed.
  void ShowFrame(ViewPicturePointer frame, bool plays);
  // Scales the frame at which the animation was paused in full quality.
  void Sharpen() { TransformChanged(); }
  // Shows an image as a stand-in for a picture of `width` by `height` until that is loaded.
  void ShowStandIn(PackedImage image, int32_t width, int32_t height);
  const ViewPicturePointer& Picture() const { return picture_; }  // null before the first one
  // The next picture is a different one: resets zoom
  // and position, unless ViewModeKeepZoom is on.
  void StartAfresh();
  // Text lines on top of the picture; may be empty.
  void SetOverlay(const std::vector<std::string>& lines);
  // A remark about the picture at the top of the window; may be empty.
  void SetNote(const wxString& note);
  // The color around the picture; that of BackdropFor at first.
  void SetAround(Color color);

  // Zooms around the center of the window by a step, to actual size, or to a mode.
  void ZoomIn() { ZoomBy(ViewTransform::kStep); }
  void ZoomOut() { ZoomBy(1 / ViewTransform::kStep); }
  void ZoomActual();  // one screen pixel per pixel
  void SetZoom(ZoomMode mode);  // also sets how the zoom follows the window
  // Screen pixels per pixel; whether part of the picture is outside the window.
  double Zoom() const { return transform_.Scale(); }
  bool CanPan() const { return transform_.CanPan(); }  // part of it is outside
  // In eighths of the window.
  void PanBy(int stepsAcross, int stepsDown);
  // Arrow keys move a picture larger than the window. False for other keys, or if all of it is
  // visible.
  bool PanByKey(int key);
  // Zoom and position, to copy between canvases.
  ViewPlace Place() const { return transform_.Place(); }
  void SetPlace(const ViewPlace& place);  // does not call `placed`

  // In screen pixels.
  wxSize DeviceSize() const { return GetClientSize() * GetContentScaleFactor(); }

 private:
  void OnSize(wxSizeEvent&);
  void OnWheel(wxMouseEvent& event);
  void OnLeftDown(wxMouseEvent& event);
  void OnLeftUp(wxMouseEvent&);
  void OnMotion(wxMouseEvent& event);
  void OnDoubleClick(wxMouseEvent& event);
  void OnPaint(wxPaintEvent&);
  void Paint();
  void PaintPicture(wxDC& dc);
  wxBitmap DrawnPicture() const;
  void Redraw();
  void PaintMessage(wxDC& dc) const;
  void PaintOverlay(wxDC& dc) const;
  void PaintNote(wxDC& dc) const;
  void ZoomBy(double factor);
  void TransformChanged();
  void UserZoomed();
  void UserPanned();
  void ScaledCame();
  bool Showable() const { return picture_ != nullptr && picture_->picture != nullptr; }
  ViewSource BestSource() const;

  const Events events_;
  ViewPicturePointer picture_;
  PackedImage standIn_;  // shown until the picture is loaded; else empty
  std::unique_ptr<ViewScaler::Scaled> scaled_;
  ViewTransform transform_;
  wxString overlay_, note_;
  Color around_ = 0;
  wxBitmap drawn_;  // the picture as last painted
  wxPoint drag_;
  const WindowCalls calls_;  // of the scaler
  std::unique_ptr<ViewScaler> scaler_;
};

}  // namespace fotomill::desktop
