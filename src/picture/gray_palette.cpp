#include "picture/gray_palette.h"

#include <cstddef>

namespace fotomill {

Palette GrayLevels(int32_t bits) {
  const int32_t levels = 1 << bits;
  Palette palette = {};
  for (int32_t i = 0; i < 3 * levels; ++i) {
    palette[static_cast<size_t>(i)] = static_cast<uint8_t>(i / 3 * 255 / (levels - 1));
  }
  return palette;
}

bool HasOnlyGrays(const Palette& palette, int32_t colors) {
  for (size_t i = 0; i < 3 * static_cast<size_t>(colors); i += 3) {
    if (palette[i] != palette[i + 1] || palette[i] != palette[i + 2]) return false;
  }
  return colors > 0;
}

}  // namespace fotomill
