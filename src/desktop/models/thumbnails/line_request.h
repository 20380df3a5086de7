#pragma once

#include <cstddef>
#include <cstdint>

#include "desktop/models/browser/browser_model.h"
#include "desktop/models/thumbnails/thumbnail.h"

namespace fotomill::desktop {

// Requests the thumbnail of a browser's line with the current settings; `side` in pixels. Main
// thread only.
ThumbnailRequest RequestForLine(const BrowserModel& model, size_t line, int32_t side);

}  // namespace fotomill::desktop
