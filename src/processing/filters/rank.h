#pragma once

#include <cstdint>

#include "core/status.h"
#include "picture/picture_record.h"
#include "processing/bands.h"

namespace fotomill {

// The smallest, the middle or the largest of the samples in the square of 2 radius + 1 pixels
// around each pixel, channel by channel. The edge repeats. Colors and alpha are ranked with the
// colors multiplied by alpha, so that the colors of transparent pixels do not show.
enum class Rank : uint8_t { Minimum, Median, Maximum };

// So that the pixels of a window can be counted in 16 bits.
inline constexpr int32_t kMostRankRadius = 127;

// Replaces the picture; the result has 24 bits. Radius 0 to kMostRankRadius. The cost of a median
// does not depend on the radius, that of the others grows with its logarithm. Statuses: EmptyImage,
// MemoryAllocationError, FunctionCancelled; the picture is then unchanged, or promoted.
Status RankPicture(PictureRecord& picture, Rank rank, int32_t radius, const Work& work);

}  // namespace fotomill
