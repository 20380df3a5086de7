#pragma once

#include <cstdint>

#include "desktop/models/drawing/rgb_image.h"

namespace fotomill::desktop {

// A square placeholder for a thumbnail, on a background color, 0x00BBGGRR: a photograph while the
// thumbnail is loading, a crossed-out sheet if there is none. `side` in pixels. Empty if out of
// memory.
RgbImage PlaceholderPixels(bool unreadable, int32_t side, Color background);

}  // namespace fotomill::desktop
