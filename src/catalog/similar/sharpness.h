#pragma once

#include "core/status.h"
#include "picture/picture_record.h"

namespace fotomill {

// A picture may be decoded as small as this for measuring.
inline constexpr int32_t kSideForSharpness = 1600;

// How sharp a picture looks: the variance of the Laplacian of its luma. It is measured at the same
// size for all pictures, so that it compares copies of different sizes, too. Source: J. L.
// Pech-Pacheco et al., "Diatom autofocusing in brightfield microscopy: a comparative study" (2000).
// The picture may be a reduced decode. Statuses of ScaleFiltered; EmptyImage (31).
Status MeasureSharpness(const PictureRecord& picture, float& sharpness);

}  // namespace fotomill
