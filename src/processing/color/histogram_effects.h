#pragma once

#include <array>
#include <cstdint>

#include "core/status.h"
#include "picture/picture_record.h"
#include "processing/bands.h"
#include "processing/color/point_effect.h"

// Effects that first count how often a picture has each level.
namespace fotomill {

// How many pixels have each value of blue, green and red. Pixels that are fully transparent are
// left out.
using LevelCounts = std::array<std::array<uint64_t, 256>, 3>;
// MemoryAllocationError (6), FunctionCancelled (4), EmptyImage (31).
Status CountLevels(const PictureRecord& picture, const Work& work, LevelCounts& counts);
// The sum of the three channels in all three: one histogram for an effect that must not change
// hues.
LevelCounts TogetherCounts(const LevelCounts& counts);

// Spreads each channel over all levels: with lo and hi the lowest and highest level left when
// `clip` percent of the pixels (rounded down) are taken off at each end, v becomes 255 (v - lo) /
// (hi - lo). A channel with one level stays.
PointEffect StretchEffect(const LevelCounts& counts, double clip);
// Makes levels equally frequent: v becomes 255 below(v) / below(highest), where below(v) counts the
// pixels with lower values and highest is the highest value there is. A channel with one level
// stays.
PointEffect EqualizeEffect(const LevelCounts& counts);

}  // namespace fotomill
