#pragma once

#include <cstdint>

namespace fotomill::desktop {

// How the scale follows the window: fit the picture,
// fit its width, fill the window, or fixed.
enum class ZoomMode { Fit, FitWidth, Fill, Free };

// Zoom and position relative to picture and window, to apply them to another picture.
struct ViewPlace {
  ZoomMode mode = ZoomMode::Fit;
  double timesFit = 1;  // the scale divided by the one that fits the window
  // the picture's point at the center of the window, as fractions of its size
  double centerX = 0.5, centerY = 0.5;
};

// Position and scale of a picture in a view window, in device pixels. At scale 1, each pixel of the
// picture is one pixel on the screen.
class ViewTransform {
 public:
  static constexpr double kStep = 1.25;  // for zooming in and out
  static constexpr double kSmallest = 0.01, kLargest = 64;

  // Sets another picture with the same zoom and relative position.
  void SetPicture(int32_t width, int32_t height);
  void SetWindow(int32_t width, int32_t height);  // device pixels
  // Sets how the scale follows the window.
  void SetMode(ZoomMode mode);
  // Sets the mode of the key DefaultViewZoom (choice::ViewZoom).
  void SetModeFromKey(int32_t zoom);
  // Sets a fixed scale, keeping the picture's point at x, y of the window in place.
  void ZoomTo(double scale, double x, double y);
  // As ZoomTo, relative to the current scale.
  void ZoomBy(double factor, double x, double y) { ZoomTo(scale_ * factor, x, y); }
  // Zooms around the center of the window.
  void ZoomToMiddle(double scale) { ZoomTo(scale, windowWidth_ / 2.0, windowHeight_ / 2.0); }
  void Pan(double dx, double dy);  // device pixels; stops at the picture's edges
  // Zoom and position, to restore with SetPlace.
  ViewPlace Place() const;
  // Restores a place from another picture or canvas, within the scale limits.
  void SetPlace(const ViewPlace& place);
  // Centers the picture; a fixed scale is replaced by the key's, fit modes are kept.
  void StartAfresh(int32_t zoom);

  // The mode, and screen pixels per picture pixel.
  ZoomMode Mode() const { return mode_; }
  double Scale() const { return scale_; }
  // Size on the screen, at least 1 pixel.
  int32_t ShownWidth() const;
  int32_t ShownHeight() const;  // device pixels
  // Position of the picture's top left corner; negative if outside.
  int32_t X() const;
  int32_t Y() const;  // device pixels
  // Whether part of the picture is outside the window.
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
