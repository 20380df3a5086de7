#pragma once

#include <array>
#include <cstdint>

namespace fotomill {

// A color as 0x00BBGGRR.
using Color = uint32_t;

// 256 colors, three bytes each in red, green, blue order.
using Palette = std::array<uint8_t, 768>;

// Default palettes that codecs request by name.
inline constexpr int32_t kBlackAndWhitePalette = 0;  // two colors, depth 1
inline constexpr int32_t kSixteenColorPalette = 2;   // the sixteen colors of VGA, depth 4
// 8 x 8 x 4 levels, depth 8: for pictures deeper than 8 bits
inline constexpr int32_t kDisplayPalette = 7;

// Clears `palette`, fills it with the colors of a kind, sets `depth` to its
// depth, and returns the number of colors. Either pointer may be null. Kinds: 0
// black and white, 1 eight primaries, 2 the 16 VGA colors, 3 to 5 32, 64 and 128
// color levels, 6 the 6 x 6 x 6 cube, 8 that cube plus 40 grays, 9 a 7 x 12 x 3
// cube plus four grays; 7 and anything above 9 the 8 x 8 x 4 display palette.
int32_t MakeDefaultPalette(Palette* palette, int32_t* depth, int32_t kind);

// Entry i is i, i, i.
Palette GrayRamp();

}  // namespace fotomill
