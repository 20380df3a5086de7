#pragma once

#include <wx/window.h>

#include <functional>
#include <memory>
#include <string>
#include <vector>

#include "desktop/models/view/view_drawing.h"
#include "desktop/models/view/view_picture.h"
#include "desktop/models/view/view_transform.h"

namespace fotomill::desktop {

// Shows one picture: zoomed by keys, wheel and double click, moved by dragging, scaled on a thread
// of its own. Which picture that is, its window decides.
class ViewCanvas : public wxWindow {
 public:
  // What it tells its window. Keys, right clicks and movements of the pointer are events of the
  // canvas.
  struct Events {
    std::function<void()> resized;           // pictures are to fit another size
    std::function<void()> changed;           // another picture or zoom
    std::function<void()> painted;           // a picture, not what stands in for it
    std::function<void()> placed = nullptr;  // zoomed or moved by the user
  };

  // The events are called on the window's thread, as long as the canvas is there.
  ViewCanvas(wxWindow* parent, Events events);
  ~ViewCanvas() override;

  // What is shown from here on; of a picture that could not be loaded, why.
  void Show(ViewPicturePointer picture);
  // Another frame of an animation, in the same place. While it plays it is drawn from what there
  // is, quickly rather than well.
  void ShowFrame(ViewPicturePointer frame, bool plays);
  // Makes pixels for the zoom of the frame at which the animation was paused.
  void Sharpen() { TransformChanged(); }
  // An image that stands in for a picture of `width` by `height` until that comes.
  void ShowStandIn(PackedImage image, int32_t width, int32_t height);
  const ViewPicturePointer& Picture() const { return picture_; }  // null before the first
  // The next picture is another one: it is shown as pictures open, unless ViewModeKeepZoom keeps
  // zoom and place.
  void StartAfresh();
  // Lines on top of the picture; empty for none.
  void SetOverlay(const std::vector<std::string>& lines);

  // Zoom by a step, to one pixel a pixel, or by a mode, about the middle of the window.
  void ZoomIn() { ZoomBy(ViewTransform::kStep); }
  void ZoomOut() { ZoomBy(1 / ViewTransform::kStep); }
  void ZoomActual();  // one pixel of the screen a pixel
  void SetZoom(ZoomMode mode);  // also sets how it follows the window
  // Pixels of the screen a pixel of the picture, and whether more of it is outside the window.
  double Zoom() const { return transform_.Scale(); }
  bool CanPan() const { return transform_.CanPan(); }  // more of it is outside
  // By eighths of the window.
  void PanBy(int stepsAcross, int stepsDown);
  // Arrows move a picture that is larger than the window. False for other keys, and where all of it
  // is seen.
  bool PanByKey(int key);
  // Zoom and place, to be taken from one canvas to others.
  ViewPlace Place() const { return transform_.Place(); }
  void SetPlace(const ViewPlace& place);  // does not call `placed`

  // Pixels of the screen.
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
  void PaintMessage(wxDC& dc) const;
  void PaintOverlay(wxDC& dc) const;
  void ZoomBy(double factor);
  void TransformChanged();
  void UserZoomed();
  void UserPanned();
  void ScaledCame();
  bool Showable() const { return picture_ != nullptr && picture_->picture != nullptr; }
  ViewSource BestSource() const;
  Backdrop BackdropHere() const;

  const Events events_;
  ViewPicturePointer picture_;
  PackedImage standIn_;  // on the screen until the picture comes; else empty
  std::unique_ptr<ViewScaler::Scaled> scaled_;
  ViewTransform transform_;
  wxString overlay_;
  wxPoint drag_;
  std::unique_ptr<ViewScaler> scaler_;
};

}  // namespace fotomill::desktop
