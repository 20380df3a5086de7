#include "desktop/models/drawing/list_palette.h"

#include <algorithm>
#include <cmath>

namespace fotomill::desktop {

namespace {

constexpr Shade kBlack{0, 0, 0}, kWhite{255, 255, 255}, kRed{0xc6, 0x28, 0x28};

double Luminance(Shade shade) {
  const auto linear = [](uint8_t value) {
    const double part = value / 255.0;
    return part <= 0.04045 ? part / 12.92 : std::pow((part + 0.055) / 1.055, 2.4);
  };
  return 0.2126 * linear(shade.red) + 0.7152 * linear(shade.green) + 0.0722 * linear(shade.blue);
}

}  // namespace

double Contrast(Shade a, Shade b) {
  const auto [darker, lighter] = std::minmax({Luminance(a), Luminance(b)});
  return (lighter + 0.05) / (darker + 0.05);
}

Shade Blend(Shade from, Shade to, double part) {
  const auto mix = [part](int a, int b) {
    return static_cast<uint8_t>(std::lround(a + (b - a) * part));
  };
  return {mix(from.red, to.red), mix(from.green, to.green), mix(from.blue, to.blue)};
}

Shade Readable(Shade wanted, Shade other) {
  constexpr int kSteps = 50;
  for (int step = 0; step <= kSteps; ++step) {
    for (const Shade& end : {kBlack, kWhite}) {
      const Shade shade = Blend(wanted, end, step / static_cast<double>(kSteps));
      if (Contrast(shade, other) >= kReadable) return shade;
    }
  }
  return wanted;  // not reached: black or white is always readable
}

ListPalette PaletteOf(Shade background, Shade text, Shade highlight, Shade highlightText) {
  ListPalette palette;
  palette.background = background;
  palette.text = Readable(text, background);
  palette.selectedText = highlightText;
  palette.selected = Readable(highlight, highlightText);
  palette.resting = Blend(highlight, background, 0.6);
  palette.restingText = Readable(palette.text, palette.resting);
  palette.frame = Blend(background, palette.text, 0.18);
  palette.faint = Blend(background, palette.text, 0.06);
  palette.note = Readable(Blend(background, palette.text, 0.62), palette.faint);
  palette.fault = Readable(kRed, palette.faint);
  return palette;
}

}  // namespace fotomill::desktop
