#pragma once

#include "picture/rectangle.h"
#include "processing/geometry/scale.h"

namespace fotomill {

// Where something is within something larger: choices of a parameter, in the order of kGravities.
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
// Words of a choice, in the order of the enumeration.
inline constexpr const char* kGravities =
    "center|top|bottom|left|right|top-left|top-right|bottom-left|bottom-right";

// The place of something of size `inner` within `outer`, `margin` pixels away from the edges that
// it is drawn to. An odd pixel of the middle goes to the right and to the bottom. May be negative
// where `inner` is larger.
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
