#include "operations/area.h"

#include <algorithm>
#include <cmath>

namespace fotomill {

namespace {

int32_t Whole(double pixels) {
  return static_cast<int32_t>(std::floor(std::clamp(pixels, -1e9, 1e9) + 0.5));
}

// The largest rectangle with this aspect ratio that fits in the picture.
Size SizeOfRatio(double across, double down, Size picture) {
  const double width = picture.width, height = picture.height;
  const bool fullWidth = width * down <= height * across;
  const double w = fullWidth ? width : height * across / down,
               h = fullWidth ? width * down / across : height;
  return {std::clamp(Whole(w), 1, picture.width), std::clamp(Whole(h), 1, picture.height)};
}

}  // namespace

Rectangle AreaOf(const Value& area, Size whole, const PictureMetadata& metadata, Gravity gravity) {
  if (area.ratio)
    return PlaceWithin(whole, SizeOfRatio(area.width.number, area.height.number, whole), gravity);
  const Size size{std::max(Whole(area.width.Pixels(whole.width, metadata.dpiX)), 1),
                  std::max(Whole(area.height.Pixels(whole.height, metadata.dpiY)), 1)};
  if (area.hasPlace) {
    return {Whole(area.x.Pixels(whole.width, metadata.dpiX)),
            Whole(area.y.Pixels(whole.height, metadata.dpiY)), size.width, size.height};
  }
  return PlaceWithin(
      whole, {std::min(size.width, whole.width), std::min(size.height, whole.height)}, gravity);
}

AreaPoint PointOf(const Value& point, Size whole, const PictureMetadata& metadata) {
  return {point.x.Pixels(whole.width, metadata.dpiX), point.y.Pixels(whole.height, metadata.dpiY)};
}

}  // namespace fotomill
