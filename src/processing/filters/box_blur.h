#pragma once

#include <cstdint>

#include "core/status.h"
#include "picture/picture_record.h"
#include "processing/bands.h"

namespace fotomill {

// So that window sums fit into 32 bits.
inline constexpr int32_t kMostBoxRadius = 127;

// Replaces each pixel by the mean of the square of 2 radius + 1 pixels around it, rounded to
// nearest; colors are weighted by alpha, and the edge is repeated. The result has 24 bits. Takes
// the same time for any radius, 0 to kMostBoxRadius. Statuses: EmptyImage, MemoryAllocationError,
// FunctionCancelled; the picture is then unchanged, or promoted.
Status BoxBlurPicture(PictureRecord& picture, int32_t radius, const Work& work);

}  // namespace fotomill
