#pragma once

#include <cstdint>

namespace fotomill::desktop {

// A color of the screen, in sRGB.
struct Shade {
  uint8_t red = 0, green = 0, blue = 0;

  bool operator==(const Shade&) const = default;
};

// How well two shades are told apart, from 1 to 21, as WCAG 2 measures it; texts want 4.5.
double Contrast(Shade a, Shade b);
inline constexpr double kReadable = 4.5;

// `part` of the way from one shade to the other.
Shade Blend(Shade from, Shade to, double part);
// The shade next to `wanted` that is readable on, or under, `other`: nearer to black or to white,
// whichever takes less.
Shade Readable(Shade wanted, Shade other);

// The shades of a canvas that lists files. Every text is readable on what it is on.
struct ListPalette {
  Shade background, text;
  Shade selected, selectedText;  // with the keyboard
  Shade resting, restingText;    // selected, while the keyboard is elsewhere
  Shade frame, faint;            // lines and fillings
  Shade note;                    // text that matters less, on background or filling
  Shade fault;                   // text about what went wrong, likewise
};

// From the system's own colors, light or dark.
ListPalette PaletteOf(Shade background, Shade text, Shade highlight, Shade highlightText);

}  // namespace fotomill::desktop
