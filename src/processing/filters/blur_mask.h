#pragma once

#include "core/status.h"
#include "picture/packed_image.h"
#include "processing/bands.h"

namespace fotomill {

// Blurs an alpha plane by a Gaussian, for the soft edges of shadows; a sigma below 0.1 changes
// nothing. Statuses as BlurPicture; on failure the plane may be empty.
Status BlurMask(PackedImage& mask, double sigma, const Work& work);

}  // namespace fotomill
