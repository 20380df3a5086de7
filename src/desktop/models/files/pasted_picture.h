#pragma once

#include <cstdint>
#include <string>
#include <vector>

#include "files/file_operation.h"
#include "desktop/models/drawing/rgb_image.h"

namespace fotomill::desktop {

// A picture from the clipboard or from a drag.
struct PastedPicture {
  RgbImage pixels;
  std::vector<uint8_t> alpha;  // a byte a pixel, top row first; empty for none
};

// Keeps a picture that came from another program: as a PNG file in `folder`, called
// ClipboardPictureName, or that with a number where the name is taken. The operation makes that
// file; a failure says why there is none. May take long; any thread.
FileOperationResult KeepPastedPicture(const PastedPicture& pasted, const std::string& folder);

}  // namespace fotomill::desktop
