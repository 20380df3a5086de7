#pragma once

#include <cstddef>
#include <cstdint>

namespace fotomill {

// Inner loops of the filtered scaler. Samples between the two passes are 16-bit numbers in 1/64 of
// a level; weights are 16-bit integers that add up to 2^shift in each window. Windows are padded
// with zero weights to a multiple of kTapGroup.
inline constexpr int32_t kTapGroup = 4;
inline constexpr int32_t kFraction = 6;        // fractional bits of a sample
// fractional bits of `factor` in `sharpen`, which is at most 2^14
inline constexpr int32_t kSharpenBits = 10;
// samples; every source row has at least this many
inline constexpr int32_t kWeighedAtOnce = 64;

// The source pixels of an output pixel along one axis.
struct FilterWindow {
  int32_t first;  // source pixel of the first weight
  int32_t taps;   // number of weights, a multiple of kTapGroup
  const int16_t* weights;
};

// A set of loops; all pointers are set.
struct ResampleKernels {
  // Weighted sum of `window.taps` rows of 8-bit levels, or of
  // samples. Writes `samples` in blocks of kWeighedAtOnce;
  // the last block may overlap the one before.
  void (*weighBytes)(const uint8_t* const* rows, const FilterWindow& window, int32_t shift,
                     size_t samples, int16_t* sum);
  void (*weighShorts)(const int16_t* const* rows, const FilterWindow& window, int32_t shift,
                      size_t samples, int16_t* sum);
  // Scales a row of pixels of three or four samples to `count` pixels. Reads up to 16 bytes past
  // the end of the last window, and may write up to 16 bytes past the result.
  void (*scaleThree)(const int16_t* row, const FilterWindow* windows, int32_t count, int32_t shift,
                     int16_t* pixels);
  void (*scaleFour)(const int16_t* row, const FilterWindow* windows, int32_t count, int32_t shift,
                    int16_t* pixels);
  // Levels to samples; and colors premultiplied by alpha to samples, four per pixel.
  void (*widen)(const uint8_t* levels, size_t count, int16_t* samples);
  void (*multiply)(const uint8_t* bgr, const uint8_t* alpha, size_t pixels, int16_t* samples);
  // Samples to levels, rounded.
  void (*narrow)(const int16_t* samples, size_t count, uint8_t* levels);
  // Sharpens levels with their blurred samples, which it replaces: adds the difference times
  // `factor` / 2^kSharpenBits unless it is below `least`, and clamps the sum.
  void (*sharpen)(const uint8_t* levels, size_t count, int32_t factor, int32_t least,
                  int16_t* samples);
  // Adds samples to sums.
  void (*add)(const int16_t* samples, size_t count, int32_t* sums);
};

// The loops for this processor, and those for every processor of the build. The
// results are identical.
const ResampleKernels& ResampleKernelsHere();
const ResampleKernels& BaselineResampleKernels();  // run on every processor

}  // namespace fotomill
