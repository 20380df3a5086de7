#pragma once

#include <wx/frame.h>
#include <wx/timer.h>

#include <memory>
#include <string>
#include <vector>

#include "desktop/view_picture.h"
#include "desktop/view_transform.h"

namespace fotomill::desktop {

class MainFrame;

// A view window: one picture at a time, with its neighbours of the list that it was opened from decoded ahead.
class ViewFrame : public wxFrame {
 public:
  ViewFrame(MainFrame& frame, const std::vector<std::string>& list, const std::string& file);
  ~ViewFrame() override;

  // Commands, by keys and menu.
  void Step(int files);
  void GoTo(size_t place);
  void StepPage(int pages);
  void ZoomIn() { ZoomBy(ViewTransform::kStep); }
  void ZoomOut() { ZoomBy(1 / ViewTransform::kStep); }
  void SetZoom(ZoomMode mode);
  void ZoomActual();
  void ToggleFullScreen();
  void ToggleSlideshow();
  void ToggleOverlay();
  void Leave();  // full screen first, then the window
  void CopyPicture();
  void DeleteFile();  // to the trash; the next one is shown
  void ShowInfoWindow();
  size_t LastPlace() const { return list_.size() - 1; }
  bool CanPan() const { return transform_.CanPan(); }
  void PanBy(int stepsAcross, int stepsDown);

 private:
  class Canvas;
  void BuildMenu();
  void ShowPlace();
  void ShowPreview();
  void WantPictures();
  void PictureCame();
  void ScaledCame();
  void TakePicture(ViewPicturePointer picture);
  void ZoomBy(double factor, double x = -1, double y = -1);
  void TransformChanged();
  void UpdateTitle();
  ViewWish WishOf(size_t place) const;
  std::string StatusLine() const;
  void HidePointerLater();
  void OnKey(wxKeyEvent& event);
  void ShowMenu(const wxPoint& place);
  void PaintCanvas();
  void LogPaint();
  const PackedImage* BestSource() const;

  MainFrame& frame_;
  std::vector<std::string> list_;
  size_t place_ = 0;
  int32_t page_ = 0;
  ViewPicturePointer shown_;  // what is on the screen; of another place until the wanted one comes
  std::unique_ptr<ViewScaler::Scaled> scaled_;
  PackedImage preview_;  // the browser's thumbnail, which is on the screen until the picture comes; else empty
  ViewTransform transform_;
  double keyTime_ = 0;  // when the picture that is awaited was asked for
  bool overlay_ = false;
  std::string painted_;  // what the log was told of
  wxTimer slideTimer_;
  wxTimer pointerTimer_;
  Canvas* canvas_ = nullptr;
  std::unique_ptr<ViewLoader> loader_;
  std::unique_ptr<ViewScaler> scaler_;
};

}  // namespace fotomill::desktop
