#pragma once

#include <cstdint>
#include <span>
#include <vector>

#include "core/status.h"
#include "core/workers/stop_token.h"
#include "formats/jpeg/jpeg_turn.h"
#include "picture/rectangle.h"
#include "processing/geometry/orient.h"
#include "texts/texts.h"

namespace fotomill {

// Converts an area of a picture as displayed to one as stored, in a file of this size.
Rectangle StoredArea(const Rectangle& shown, Size stored, Orientation orientation);
// The reverse.
Rectangle ShownArea(const Rectangle& stored, Size size, Orientation orientation);

// The nearest area to which a JPEG picture can be cropped losslessly, as displayed: its stored left
// and top edges move to the nearest blocks, the others stay.
Rectangle LosslessArea(const Rectangle& shown, const JpegGrid& grid, Orientation orientation);

// Losslessly crops a JPEG file to an area of the picture as displayed by EXIF orientation, which
// stays. EXIF, XMP, all other segments and data after the picture are kept; sizes in EXIF are
// updated, and its thumbnail is dropped. `made` is empty, with the reason in `obstacle`, if the
// area does not lie between blocks or the file cannot be rewritten losslessly. Statuses of reading.
Status MakeCroppedJpeg(std::span<const uint8_t> file, const Rectangle& shown, const StopToken& stop,
                       std::vector<uint8_t>& made, RecordedText& obstacle);

}  // namespace fotomill
