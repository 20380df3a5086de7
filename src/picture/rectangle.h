#pragma once

#include <cstdint>

namespace fotomill {

// An axis-aligned rectangle in pixels, y downward.
struct Rectangle {
  int32_t x = 0, y = 0, width = 0, height = 0;
  bool operator==(const Rectangle&) const = default;
};

}  // namespace fotomill
