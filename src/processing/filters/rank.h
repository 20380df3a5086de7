#pragma once

#include <cstdint>

#include "core/status.h"
#include "picture/picture_record.h"
#include "processing/bands.h"

namespace fotomill {

// Rank filters: the minimum, median or maximum of the samples in the square of 2 radius + 1 pixels
// around each pixel, per channel. The edge is repeated. Works on premultiplied colors, so that the
// colors of transparent pixels do not show.
enum class Rank : uint8_t { Minimum, Median, Maximum };

// So that the pixels of a window can be counted in 16 bits.
inline constexpr int32_t kMostRankRadius = 127;

// Replaces the picture; the result has 24 bits. Radius 0 to kMostRankRadius. The time for a median
// does not depend on the radius, for the others it is logarithmic. Statuses: EmptyImage,
// MemoryAllocationError, FunctionCancelled; the picture is then unchanged, or promoted.
Status RankPicture(PictureRecord& picture, Rank rank, int32_t radius, const Work& work);

}  // namespace fotomill
