#include "desktop/models/drawing/histogram.h"

#include <algorithm>
#include <cmath>

#include "picture/packed_image.h"

namespace fotomill::desktop {

namespace {

constexpr int64_t kCounted = 1'000'000;  // pixels, about
constexpr int kLast = 255;

// The highest count except those of the extreme levels; of these if there are no others.
uint32_t Highest(const Histogram& histogram) {
  uint32_t inner = 0, outer = 1;
  for (const Levels* levels : {&histogram.red, &histogram.green, &histogram.blue}) {
    inner = std::max(inner, *std::max_element(levels->begin() + 1, levels->end() - 1));
    outer = std::max({outer, levels->front(), levels->back()});
  }
  return inner > 0 ? inner : outer;
}

// The height of a channel's column: the square root shows rare levels, too.
int32_t HeightOf(const Levels& levels, int32_t column, int32_t width, int32_t height,
                 uint32_t highest) {
  const int32_t first = column * (kLast + 1) / width;
  const int32_t end = std::max((column + 1) * (kLast + 1) / width, first + 1);
  const uint32_t count = *std::max_element(levels.begin() + first, levels.begin() + end);
  const double part = std::min(static_cast<double>(count) / highest, 1.0);
  return static_cast<int32_t>(std::lround(std::sqrt(part) * height));
}

// The color where the named channels overlap.
Shade MixOf(bool red, bool green, bool blue, Shade background) {
  constexpr uint8_t kStrong = 0xd8, kWeak = 0x50;
  constexpr double kCover = 0.85;
  if (red && green && blue) return Blend(background, {0x80, 0x80, 0x80}, kCover);
  const auto level = [](bool on) { return on ? kStrong : kWeak; };
  return Blend(background, {level(red), level(green), level(blue)}, kCover);
}

}  // namespace

Histogram HistogramOf(const PackedImage& image) {
  Histogram histogram;
  if (image.Bits() != 24) return histogram;
  const int64_t pixels = int64_t{image.Width()} * image.Height();
  const auto step =
      std::max(static_cast<int32_t>(std::sqrt(static_cast<double>(pixels) / kCounted)), 1);
  for (int32_t y = 0; y < image.Height(); y += step) {
    const uint8_t* const row = image.StoredRow(y).data();
    for (int32_t x = 0; x < image.Width(); x += step) {
      const uint8_t* const pixel = row + static_cast<size_t>(x) * 3;
      ++histogram.blue[pixel[0]];
      ++histogram.green[pixel[1]];
      ++histogram.red[pixel[2]];
    }
  }
  return histogram;
}

RgbImage HistogramPixels(const Histogram& histogram, int32_t width, int32_t height,
                         Shade background) {
  if (width < 1 || height < 1) return {};
  RgbImage pixels = FilledImage(
      width, height,
      static_cast<Color>(background.red | background.green << 8 | background.blue << 16));
  if (pixels.Empty()) return pixels;
  const uint32_t highest = Highest(histogram);
  for (int32_t x = 0; x < width; ++x) {
    const int32_t red = HeightOf(histogram.red, x, width, height, highest),
                  green = HeightOf(histogram.green, x, width, height, highest),
                  blue = HeightOf(histogram.blue, x, width, height, highest);
    const int32_t top = std::max({red, green, blue});
    for (int32_t above = 0; above < top; ++above) {
      const Shade shade = MixOf(above < red, above < green, above < blue, background);
      uint8_t* const pixel = pixels.Row(height - 1 - above) + static_cast<size_t>(x) * 3;
      pixel[0] = shade.red;
      pixel[1] = shade.green;
      pixel[2] = shade.blue;
    }
  }
  return pixels;
}

}  // namespace fotomill::desktop
