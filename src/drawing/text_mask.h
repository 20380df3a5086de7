#pragma once

#include "core/status.h"
#include "drawing/font_faces.h"
#include "drawing/text_line.h"
#include "picture/packed_image.h"
#include "processing/bands.h"

namespace fotomill {

// Adds a line to a mask, which is an alpha plane: 255 where
// letters fully cover a pixel. Clipped to the mask. `fonts` are
// the ones the line was shaped with. MemoryAllocationError, FunctionCancelled (4) if the work was
// stopped.
Status DrawLine(const FontFaces& fonts, const TextLine& line, const LinePlace& place,
                PackedImage& mask, const Work& work = {});

}  // namespace fotomill
