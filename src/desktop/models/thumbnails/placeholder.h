#pragma once

#include <cstdint>

#include "desktop/models/drawing/rgb_image.h"

namespace fotomill::desktop {

// The picture that stands for a thumbnail, as a square on a background of one color, 0x00BBGGRR: a
// photograph while the thumbnail is on its way, a crossed-out sheet when there can be none. `side`:
// pixels. Empty without memory.
RgbImage PlaceholderPixels(bool unreadable, int32_t side, Color background);

}  // namespace fotomill::desktop
