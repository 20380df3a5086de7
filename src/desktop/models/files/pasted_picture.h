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
  std::vector<uint8_t> alpha;  // one byte per pixel, top row first; may be empty
};

// Saves a picture from another program as a PNG file in `folder`, named ClipboardPictureName, with
// a number if that is taken. The operation creates that file; a failure has the reason. May take
// long; any thread.
FileOperationResult KeepPastedPicture(const PastedPicture& pasted, const std::string& folder);

}  // namespace fotomill::desktop
