#pragma once

#include <array>
#include <cstdint>
#include <functional>
#include <span>

#include "core/status.h"
#include "picture/picture_record.h"
#include "processing/bands.h"

namespace fotomill {

// A new value for each value of a channel.
using ChannelTable = std::array<uint8_t, 256>;

// An effect in which each pixel's new color depends on its old color alone: three tables where the
// channels are independent, else a function over a row of pixels. Alpha stays as it is.
struct PointEffect {
  std::array<ChannelTable, 3> tables{};                         // blue, green, red
  // used in place of the tables when set
  std::function<void(uint8_t* bgr, size_t pixels)> colors = {};

  bool IsTable() const { return !colors; }  // each channel by itself, through a table
};

// The effect with one table for all channels: value v becomes `value(v)`, rounded to nearest (ties
// up) and clamped.
PointEffect EffectOf(const std::function<double(double)>& value);

// Rounds to nearest, ties up, and clamps to 0 to 255.
constexpr uint8_t RoundedLevel(double value) {
  return value <= 0 ? 0 : value >= 255 ? 255 : static_cast<uint8_t>(value + 0.5);
}

// Applies effects one after the other in a single pass; neighboring tables are merged first. A
// palette picture keeps its depth: its palette is changed. A 24-bit picture is changed row by row.
// The result equals that of separate passes. FunctionCancelled (4) leaves the picture half done;
// EmptyImage without one.
Status ApplyPointEffects(PictureRecord& picture, std::span<const PointEffect> effects,
                         const Work& work);

}  // namespace fotomill
