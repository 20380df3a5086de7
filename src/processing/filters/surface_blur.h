#pragma once

#include <cstdint>

#include "core/status.h"
#include "picture/picture_record.h"
#include "processing/bands.h"

namespace fotomill {

// Blurs that keep edges. Alpha stays. Statuses as FilterRows.

// Each level becomes the mean of those in a square of 2 radius + 1 that differ from it by at most
// `threshold`; one that differs by d counts threshold + 1 - d times.
inline constexpr int32_t kMostSurfaceRadius = 20;
Status SurfaceBlurPicture(PictureRecord& picture, int32_t radius, int32_t threshold,
                          const Work& work);

// Pixels of which a channel differs from the median of a square of 2 radius + 1 by more than
// `threshold` take its color.
Status DespecklePicture(PictureRecord& picture, int32_t radius, int32_t threshold,
                        const Work& work);

}  // namespace fotomill
