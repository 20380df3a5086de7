#pragma once

#include <array>
#include <cstdint>

#include "processing/color/point_effect.h"

// Effects in which the channels of a color act on each other.
namespace fotomill {

// Brightness of a color as television defines it, in thousandths of a level: 0.299 R + 0.587 G +
// 0.114 B. Source: ITU-R BT.601-7, section 2.5.1.
constexpr int32_t LumaThousandths(uint8_t red, uint8_t green, uint8_t blue) {
  return 299 * red + 587 * green + 114 * blue;
}
// The same in levels, rounded to nearest.
constexpr uint8_t Luma(uint8_t red, uint8_t green, uint8_t blue) {
  return static_cast<uint8_t>((LumaThousandths(red, green, blue) + 500) / 1000);
}

// New red, green and blue as sums of the old ones: row by row, the factors of old red, green and
// blue, then a number of levels to add. The absolute values of a row's factors add up to less than
// kMostMix.
using MixMatrix = std::array<std::array<double, 4>, 3>;
inline constexpr double kMostMix = 7;
// Exact, ties up, where factors are multiples of 0.00001.
PointEffect MixEffect(const MixMatrix& matrix);

// Every channel becomes the luma.
PointEffect GrayEffect();
// luma + (v - luma) share, for a share from 0 (gray) on.
PointEffect SaturationEffect(double share);
// Old photographs: red 0.393 R + 0.769 G + 0.189 B, green 0.349 R + 0.686 G + 0.168 B, blue 0.272 R
// + 0.534 G + 0.131 B, mixed with the color as it was where `share` is below 1.
PointEffect SepiaEffect(double share);
// One channel's values in all three.
enum class KeptChannel : int32_t { Red, Green, Blue };
PointEffect KeepEffect(KeptChannel channel);
// Two channels exchanged.
enum class SwappedChannels : int32_t { RedGreen, RedBlue, GreenBlue };
PointEffect SwapEffect(SwappedChannels channels);

// White where the luma, not rounded, is at least `t`, else black.
PointEffect ThresholdEffect(int32_t t);
// Turns the hue of the HSV model by `degrees`; the largest and the smallest channel value of a
// pixel stay. Source: Smith, "Color Gamut Transform Pairs", SIGGRAPH 1978.
PointEffect HueEffect(double degrees);
// Colors by luma, from `dark` at 0 through `color` at 127.5 to `light` at 255, in straight lines.
// Each is blue, green, red.
using BgrColor = std::array<uint8_t, 3>;
PointEffect ColorizeEffect(const BgrColor& color, const BgrColor& dark, const BgrColor& light);

}  // namespace fotomill
