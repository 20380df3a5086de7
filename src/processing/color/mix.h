#pragma once

#include <array>
#include <cstdint>

#include "processing/color/point_effect.h"

// Effects that combine the channels of a color.
namespace fotomill {

// Luma in thousandths of a level: 0.299 R + 0.587 G + 0.114 B. Source: ITU-R
// BT.601-7, section 2.5.1.
constexpr int32_t LumaThousandths(uint8_t red, uint8_t green, uint8_t blue) {
  return 299 * red + 587 * green + 114 * blue;
}
// Luma in levels, rounded to nearest.
constexpr uint8_t Luma(uint8_t red, uint8_t green, uint8_t blue) {
  return static_cast<uint8_t>((LumaThousandths(red, green, blue) + 500) / 1000);
}

// A color matrix: for new red, green and blue, the factors of old
// red, green and blue, then an offset in levels. The absolute
// values of a row's factors must add up to less than kMostMix.
using MixMatrix = std::array<std::array<double, 4>, 3>;
inline constexpr double kMostMix = 7;
// Exact, rounding ties up, if factors are multiples of 0.00001.
PointEffect MixEffect(const MixMatrix& matrix);

// Replaces every channel with the luma.
PointEffect GrayEffect();
// luma + (v - luma) share, with share >= 0; 0 gives gray.
PointEffect SaturationEffect(double share);
// Sepia: red 0.393 R + 0.769 G + 0.189 B, green 0.349 R + 0.686 G + 0.168 B, blue 0.272 R + 0.534 G
// + 0.131 B, blended with the original color if `share` is below 1.
PointEffect SepiaEffect(double share);
// Copies one channel to all three.
enum class KeptChannel : int32_t { Red, Green, Blue };
PointEffect KeepEffect(KeptChannel channel);
// Swaps two channels.
enum class SwappedChannels : int32_t { RedGreen, RedBlue, GreenBlue };
PointEffect SwapEffect(SwappedChannels channels);

// White if the exact luma is at least `t`, else black.
PointEffect ThresholdEffect(int32_t t);
// Rotates the HSV hue by `degrees`; the maximum and minimum channel values of a pixel are kept.
// Source: Smith, "Color Gamut Transform Pairs", SIGGRAPH 1978.
PointEffect HueEffect(double degrees);
// Maps luma to colors by linear interpolation from `dark` at 0 through `color` at 127.5 to `light`
// at 255. Each is blue, green, red.
using BgrColor = std::array<uint8_t, 3>;
PointEffect ColorizeEffect(const BgrColor& color, const BgrColor& dark, const BgrColor& light);

}  // namespace fotomill
