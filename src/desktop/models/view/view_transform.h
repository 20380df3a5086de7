#pragma once

#include <cstdint>

namespace fotomill::desktop {

// How the scale follows the window: all of the picture in it, its width alone, the window filled,
// or not at all.
enum class ZoomMode { Fit, FitWidth, Fill, Free };

// Zoom and place in relation to a picture and a window, so that they mean the same for others.
struct ViewPlace {
  ZoomMode mode = ZoomMode::Fit;
  double timesFit = 1;                  // the scale as a multiple of that which fits the window
  // what is in the middle of the window, in parts of the picture
  double centerX = 0.5, centerY = 0.5;
};

// Where a picture is in a view window and how large: pure arithmetic in device pixels. A scale of 1
// shows each pixel of the picture as one pixel of the screen.
class ViewTransform {
 public:
  static constexpr double kStep = 1.25;  // of zooming in and out
  static constexpr double kSmallest = 0.01, kLargest = 64;

  // Another picture at the same zoom, and at the same place in parts of it.
  void SetPicture(int32_t width, int32_t height);
  void SetWindow(int32_t width, int32_t height);  // device pixels
  // How the scale follows the window from now on.
  void SetMode(ZoomMode mode);
  // What the key DefaultViewZoom stands for (choice::ViewZoom).
  void SetModeFromKey(int32_t zoom);
  // A scale of its own; the picture's point at x, y of the window stays there.
  void ZoomTo(double scale, double x, double y);
  // As ZoomTo, in relation to the scale now.
  void ZoomBy(double factor, double x, double y) { ZoomTo(scale_ * factor, x, y); }
  // To the scale in the middle of the window.
  void ZoomToMiddle(double scale) { ZoomTo(scale, windowWidth_ / 2.0, windowHeight_ / 2.0); }
  void Pan(double dx, double dy);  // device pixels; stops at the picture's edges
  // Zoom and position, for SetPlace of a later picture.
  ViewPlace Place() const;
  // From another picture or canvas; within the limits of the scale.
  void SetPlace(const ViewPlace& place);
  // To the middle; a zoom of its own gives way to what the key stands for, fitting stays.
  void StartAfresh(int32_t zoom);

  // How the scale is found, and pixels of the screen a pixel of the picture.
  ZoomMode Mode() const { return mode_; }
  double Scale() const { return scale_; }
  // Size on the screen, at least a pixel.
  int32_t ShownWidth() const;
  int32_t ShownHeight() const;  // device pixels
  // Of the picture's top left corner; negative when it is outside.
  int32_t X() const;
  int32_t Y() const;  // device pixels
  // More of the picture is outside the window.
  bool CanPan() const { return ShownWidth() > windowWidth_ || ShownHeight() > windowHeight_; }

 private:
  double FitScale() const;
  void ScaleByMode();
  void Update();
  void PutCenter(double x, double y);
  void KeepInside();

  int32_t pictureWidth_ = 1, pictureHeight_ = 1;
  int32_t windowWidth_ = 1, windowHeight_ = 1;
  ZoomMode mode_ = ZoomMode::Fit;
  double scale_ = 1;
  double x_ = 0, y_ = 0;
};

}  // namespace fotomill::desktop
