// Scaling, color reduction, rotation and flattening of a 6-megapixel picture, in source
// pixels per second.
#include <benchmark/benchmark.h>

#include <cmath>

#include "processing/flatten.h"
#include "processing/geometry/orient.h"
#include "processing/geometry/scale.h"
#include "processing/palette/reduce.h"

namespace fotomill {
namespace {

constexpr int32_t kWidth = 3000, kHeight = 2000;

// Colored waves with some noise, about as complex as a photograph.
PicturePointer MakePhotograph() {
  PicturePointer picture = NewPictureRecord();
  if (NewPackedImage(kWidth, kHeight, nullptr, 24, picture->image) != Status::Ok) std::abort();
  picture->width = kWidth;
  picture->height = kHeight;
  picture->bitsPerPixel = 24;
  uint32_t noise = 1;
  for (int32_t y = 0; y < kHeight; ++y) {
    uint8_t* pixel = picture->image.Row(y).data();
    for (int32_t x = 0; x < kWidth; ++x, pixel += 3) {
      noise = noise * 1664525 + 1013904223;
      for (int c = 0; c < 3; ++c) {
        const double wave = std::sin(x / (200.0 + 90 * c)) + std::cos(y / (300.0 - 70 * c)) +
                            std::sin((x + y) / 37.0) / 4;
        pixel[c] = static_cast<uint8_t>(124 + 50 * wave + (noise >> (24 + c) & 7));
      }
    }
  }
  return picture;
}

const PictureRecord& Photograph() {
  static const PicturePointer picture = MakePhotograph();
  return *picture;
}

void CountPixels(benchmark::State& state) {
  state.SetItemsProcessed(state.iterations() * kWidth * kHeight);
}

void Scale(benchmark::State& state, Size size, ScaleFilter filter, bool withAlpha) {
  PackedImage alpha, image, plane;
  if (withAlpha) {
    if (NewAlphaPlane(kWidth, kHeight, alpha) != Status::Ok) std::abort();
    for (size_t i = 0; i < alpha.Rows().size(); ++i) alpha.Rows()[i] = static_cast<uint8_t>(i >> 4);
  }
  for (auto _ : state) {
    if (ScaleFiltered(Photograph().image, alpha, size, filter, image, plane) != Status::Ok)
      std::abort();
  }
  CountPixels(state);
}
BENCHMARK_CAPTURE(Scale, half_lanczos, Size{1500, 1000}, ScaleFilter::Lanczos, false)->Unit(benchmark::kMillisecond);
BENCHMARK_CAPTURE(Scale, half_bicubic, Size{1500, 1000}, ScaleFilter::Bicubic, false)->Unit(benchmark::kMillisecond);
BENCHMARK_CAPTURE(Scale, half_bilinear, Size{1500, 1000}, ScaleFilter::Bilinear, false)->Unit(benchmark::kMillisecond);
BENCHMARK_CAPTURE(Scale, half_nearest, Size{1500, 1000}, ScaleFilter::Nearest, false)->Unit(benchmark::kMillisecond);
BENCHMARK_CAPTURE(Scale, half_lanczos_alpha, Size{1500, 1000}, ScaleFilter::Lanczos, true)->Unit(benchmark::kMillisecond);
BENCHMARK_CAPTURE(Scale, thumbnail, Size{96, 64}, ScaleFilter::Lanczos, false)->Unit(benchmark::kMillisecond);
BENCHMARK_CAPTURE(Scale, thumbnail_alpha, Size{96, 64}, ScaleFilter::Lanczos, true)->Unit(benchmark::kMillisecond);
BENCHMARK_CAPTURE(Scale, double_lanczos, Size{6000, 4000}, ScaleFilter::Lanczos, false)->Unit(benchmark::kMillisecond);

// Runs `operation` on copies of the photograph.
template <typename Operation>
void OnCopies(benchmark::State& state, Operation operation) {
  for (auto _ : state) {
    state.PauseTiming();
    PicturePointer picture = NewPictureRecord();
    const Size size{kWidth, kHeight};
    if (ScaleNearest(Photograph().image, size, picture->image) != Status::Ok) std::abort();
    picture->bitsPerPixel = 24;
    state.ResumeTiming();
    if (operation(*picture) != Status::Ok) std::abort();
    state.PauseTiming();
    picture.reset();
    state.ResumeTiming();
  }
  CountPixels(state);
}

void Reduce(benchmark::State& state, int32_t bits, Dither dither) {
  ReduceOptions options;
  options.colorDither = options.monoDither = dither;
  OnCopies(state, [&](PictureRecord& picture) { return ReduceColors(picture, bits, options); });
}
BENCHMARK_CAPTURE(Reduce, 256_colors, 8, Dither::None)->Unit(benchmark::kMillisecond);
BENCHMARK_CAPTURE(Reduce, 256_colors_ordered, 8, Dither::Ordered)->Unit(benchmark::kMillisecond);
BENCHMARK_CAPTURE(Reduce, 256_colors_diffused, 8, Dither::FloydSteinberg)->Unit(benchmark::kMillisecond);
BENCHMARK_CAPTURE(Reduce, 16_colors, 4, Dither::None)->Unit(benchmark::kMillisecond);
BENCHMARK_CAPTURE(Reduce, 16_colors_diffused, 4, Dither::FloydSteinberg)->Unit(benchmark::kMillisecond);
BENCHMARK_CAPTURE(Reduce, mono_threshold, 1, Dither::None)->Unit(benchmark::kMillisecond);
BENCHMARK_CAPTURE(Reduce, mono_diffused, 1, Dither::FloydSteinberg)->Unit(benchmark::kMillisecond);

void Orient(benchmark::State& state) {
  OnCopies(state, [](PictureRecord& picture) {
    return OrientPicture(picture, Orientation::QuarterRight);
  });
}
BENCHMARK(Orient)->Unit(benchmark::kMillisecond);

void Flatten(benchmark::State& state) {
  OnCopies(state, [](PictureRecord& picture) {
    RETURN_IF_BAD(NewAlphaPlane(kWidth, kHeight, picture.alpha));
    return FlattenAlpha(picture);
  });
}
BENCHMARK(Flatten)->Unit(benchmark::kMillisecond);

}  // namespace
}  // namespace fotomill
