#pragma once

#include "picture/rectangle.h"
#include "processing/geometry/scale.h"

namespace fotomill {

// Alignment within a larger area; values are indices into kGravities.
enum class Gravity : int32_t {
  Center,
  Top,
  Bottom,
  Left,
  Right,
  TopLeft,
  TopRight,
  BottomLeft,
  BottomRight
};
// Words for a choice parameter, in enum order.
inline constexpr const char* kGravities =
    "center|top|bottom|left|right|top-left|top-right|bottom-left|bottom-right";

// Position of a rectangle of size `inner` within `outer`, with `margin` pixels to the edges it is
// aligned to. When centering, the odd pixel goes to the right and bottom. May be negative if
// `inner` is larger.
constexpr Rectangle PlaceWithin(Size outer, Size inner, Gravity gravity, int32_t margin = 0) {
  constexpr int kAcross[] = {0, 0, 0, -1, 1, -1, 1, -1, 1},
                kDown[] = {0, -1, 1, 0, 0, -1, -1, 1, 1};
  const auto place = [margin](int64_t room, int side) {
    const int64_t middle = room >= 0 ? room / 2 : (room - 1) / 2;
    return static_cast<int32_t>(side < 0 ? margin : side > 0 ? room - margin : middle);
  };
  const auto g = static_cast<size_t>(gravity);
  return {place(static_cast<int64_t>(outer.width) - inner.width, kAcross[g]),
          place(static_cast<int64_t>(outer.height) - inner.height, kDown[g]), inner.width,
          inner.height};
}

}  // namespace fotomill
