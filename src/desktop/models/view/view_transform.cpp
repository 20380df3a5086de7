#include "desktop/models/view/view_transform.h"

#include <algorithm>
#include <cmath>
#include <iterator>

#include "core/choice_lists.h"
#include "settings/settings.h"

namespace fotomill::desktop {

namespace {

// The scales of choice::ViewZoom 1 to 12.
constexpr double kListedScales[] = {0.10, 0.20, 0.25, 1.0 / 3, 0.50, 0.75, 1, 1.5, 2, 3, 4, 8};

// The position of an edge of this length: centered if it fits, otherwise without gaps.
double KeptInside(double position, double length, double window) {
  if (length <= window) return (window - length) / 2;
  return std::clamp(position, window - length, 0.0);
}

}  // namespace

void ViewTransform::SetPicture(int32_t width, int32_t height) {
  const ViewPlace place = Place();
  pictureWidth_ = std::max(width, 1);
  pictureHeight_ = std::max(height, 1);
  ScaleByMode();
  PutCenter(place.centerX, place.centerY);
}

void ViewTransform::SetWindow(int32_t width, int32_t height) {
  x_ += (width - windowWidth_) / 2.0;
  y_ += (height - windowHeight_) / 2.0;
  windowWidth_ = std::max(width, 1);
  windowHeight_ = std::max(height, 1);
  Update();
}

void ViewTransform::SetMode(ZoomMode mode) {
  mode_ = mode;
  Update();
}

void ViewTransform::SetModeFromKey(int32_t zoom) {
  if (zoom == choice::kZoomFitWidth) return SetMode(ZoomMode::FitWidth);
  if (zoom == choice::kZoomFill) return SetMode(ZoomMode::Fill);
  if (zoom < 1 || zoom > static_cast<int32_t>(std::size(kListedScales)))
    return SetMode(ZoomMode::Fit);
  ZoomToMiddle(kListedScales[zoom - 1]);
}

void ViewTransform::ZoomTo(double scale, double x, double y) {
  const double before = scale_;
  mode_ = ZoomMode::Free;
  scale_ = std::clamp(scale, kSmallest, kLargest);
  if (std::abs(scale_ - 1) < 0.01) scale_ = 1;  // zooming in and out again ends at exactly 1
  x_ = x - (x - x_) * scale_ / before;
  y_ = y - (y - y_) * scale_ / before;
  KeepInside();
}

void ViewTransform::Pan(double dx, double dy) {
  x_ += dx;
  y_ += dy;
  KeepInside();
}

ViewPlace ViewTransform::Place() const {
  return {mode_, scale_ / FitScale(), (windowWidth_ / 2.0 - x_) / ShownWidth(),
          (windowHeight_ / 2.0 - y_) / ShownHeight()};
}

void ViewTransform::SetPlace(const ViewPlace& place) {
  mode_ = place.mode;
  if (mode_ == ZoomMode::Free)
    scale_ = std::clamp(place.timesFit * FitScale(), kSmallest, kLargest);
  ScaleByMode();
  PutCenter(place.centerX, place.centerY);
}

void ViewTransform::StartAfresh(int32_t zoom) {
  if (mode_ == ZoomMode::Free) SetModeFromKey(zoom);
  PutCenter(0.5, 0.5);
}

int32_t ViewTransform::ShownWidth() const {
  return std::max(static_cast<int32_t>(std::lround(pictureWidth_ * scale_)), 1);
}
int32_t ViewTransform::ShownHeight() const {
  return std::max(static_cast<int32_t>(std::lround(pictureHeight_ * scale_)), 1);
}
int32_t ViewTransform::X() const { return static_cast<int32_t>(std::floor(x_)); }
int32_t ViewTransform::Y() const { return static_cast<int32_t>(std::floor(y_)); }

double ViewTransform::FitScale() const {
  return std::min(static_cast<double>(windowWidth_) / pictureWidth_,
                  static_cast<double>(windowHeight_) / pictureHeight_);
}

void ViewTransform::ScaleByMode() {
  const double across = static_cast<double>(windowWidth_) / pictureWidth_;
  const double down = static_cast<double>(windowHeight_) / pictureHeight_;
  if (mode_ == ZoomMode::Fit) scale_ = FitScale();
  if (mode_ == ZoomMode::FitWidth) scale_ = across;
  if (mode_ == ZoomMode::Fill) scale_ = std::max(across, down);
  if (mode_ == ZoomMode::Fit && settings.OptimumZoomNoUpsize != 0) scale_ = std::min(scale_, 1.0);
}

// Keeps the center of the window.
void ViewTransform::Update() {
  const double before = scale_;
  ScaleByMode();
  x_ = windowWidth_ / 2.0 - (windowWidth_ / 2.0 - x_) * scale_ / before;
  y_ = windowHeight_ / 2.0 - (windowHeight_ / 2.0 - y_) * scale_ / before;
  KeepInside();
}

void ViewTransform::PutCenter(double x, double y) {
  x_ = windowWidth_ / 2.0 - x * ShownWidth();
  y_ = windowHeight_ / 2.0 - y * ShownHeight();
  KeepInside();
}

void ViewTransform::KeepInside() {
  x_ = KeptInside(x_, ShownWidth(), windowWidth_);
  y_ = KeptInside(y_, ShownHeight(), windowHeight_);
}

}  // namespace fotomill::desktop
