#pragma once

#include <cstdint>

namespace fotomill::desktop {

// A screen color, in sRGB.
struct Shade {
  uint8_t red = 0, green = 0, blue = 0;

  bool operator==(const Shade&) const = default;
};

// Contrast ratio of two shades, 1 to 21, as defined by WCAG 2; text should have 4.5.
double Contrast(Shade a, Shade b);
inline constexpr double kReadable = 4.5;

// Interpolates between two shades.
Shade Blend(Shade from, Shade to, double part);
// The closest shade to `wanted` that is readable on `other`, lightened or darkened as little as
// possible.
Shade Readable(Shade wanted, Shade other);

// Colors of a file list. All texts are readable on their backgrounds.
struct ListPalette {
  Shade background, text;
  Shade selected, selectedText;  // if the list is focused
  Shade resting, restingText;    // selected, if the list is not focused
  Shade frame, faint;            // lines and fills
  Shade note;                    // secondary text, on background or fill
  Shade fault;                   // error text, likewise
};

// Derived from the system colors, light or dark.
ListPalette PaletteOf(Shade background, Shade text, Shade highlight, Shade highlightText);

}  // namespace fotomill::desktop
