#pragma once

#include <cstdint>

#include "core/status.h"
#include "picture/picture_record.h"
#include "processing/bands.h"

namespace fotomill {

// Edge-preserving blurs. Alpha is unchanged. Statuses as FilterRows.

// Each level becomes a weighted mean of those in a square of 2 radius + 1 that differ from it by at
// most `threshold`; a difference of d has the weight threshold + 1 - d.
inline constexpr int32_t kMostSurfaceRadius = 20;
Status SurfaceBlurPicture(PictureRecord& picture, int32_t radius, int32_t threshold,
                          const Work& work);

// Pixels with a channel that differs from the median of a square of 2 radius + 1 by more than
// `threshold` take the median's color.
Status DespecklePicture(PictureRecord& picture, int32_t radius, int32_t threshold,
                        const Work& work);

}  // namespace fotomill
