#pragma once

#include <array>
#include <cstdint>
#include <functional>
#include <span>

#include "core/status.h"
#include "picture/picture_record.h"
#include "processing/bands.h"

namespace fotomill {

// Lookup table for one channel.
using ChannelTable = std::array<uint8_t, 256>;

// An effect where a pixel's new color depends only on its old color: three tables if the channels
// are independent, else a function over a row of pixels. Alpha is unchanged.
struct PointEffect {
  std::array<ChannelTable, 3> tables{};                         // blue, green, red
  // replaces the tables if set
  std::function<void(uint8_t* bgr, size_t pixels)> colors = {};
  // of `colors`: an effect equal to these tables followed by this one, if it can absorb them
  std::function<PointEffect(const std::array<ChannelTable, 3>& first)> after = {};

  bool IsTable() const { return !colors; }  // channels are independent
};

// An effect with the same table for all channels: v becomes `value(v)`, rounded to nearest (ties
// up) and clamped.
PointEffect EffectOf(const std::function<double(double)>& value);

// Rounds to nearest, ties up, and clamps to 0 to 255.
constexpr uint8_t RoundedLevel(double value) {
  return value <= 0 ? 0 : value >= 255 ? 255 : static_cast<uint8_t>(value + 0.5);
}

// Applies effects in order in a single pass; adjacent tables are merged
// first, also into an effect that absorbs them. For palette pictures only the palette is changed;
// 24-bit pictures are changed row by row. The result equals that of separate passes.
// FunctionCancelled (4) leaves the picture half done; EmptyImage without one.
Status ApplyPointEffects(PictureRecord& picture, std::span<const PointEffect> effects,
                         const Work& work);

}  // namespace fotomill
