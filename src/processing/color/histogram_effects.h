#pragma once

#include <array>
#include <cstdint>

#include "core/status.h"
#include "picture/picture_record.h"
#include "processing/bands.h"
#include "processing/color/point_effect.h"

// Effects based on a picture's histogram.
namespace fotomill {

// Number of pixels for each value of blue, green and
// red. Fully transparent pixels are not counted.
using LevelCounts = std::array<std::array<uint64_t, 256>, 3>;
// MemoryAllocationError (6), FunctionCancelled (4), EmptyImage (31).
Status CountLevels(const PictureRecord& picture, const Work& work, LevelCounts& counts);
// The sum of the three channels, repeated for each: a common histogram for effects that must not
// change hues.
LevelCounts TogetherCounts(const LevelCounts& counts);

// Stretches the contrast of each channel: v becomes 255 (v - lo) / (hi - lo), where lo and hi are
// the lowest and highest level after discarding `clip` percent of the pixels (rounded down) at each
// end. A channel with a single level is unchanged.
PointEffect StretchEffect(const LevelCounts& counts, double clip);
// Equalizes the histogram: v becomes 255 below(v) / below(highest), where below(v) is the number of
// pixels with lower values and highest is the highest value present. A channel with a single level
// is unchanged.
PointEffect EqualizeEffect(const LevelCounts& counts);

}  // namespace fotomill
