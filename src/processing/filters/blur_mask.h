#pragma once

#include "core/status.h"
#include "picture/packed_image.h"
#include "processing/bands.h"

namespace fotomill {

// Applies a Gaussian blur to an alpha plane, for soft shadows; a sigma below 0.1 is a no-op.
// Statuses as BlurPicture; on failure the plane may be empty.
Status BlurMask(PackedImage& mask, double sigma, const Work& work);

}  // namespace fotomill
