#pragma once

#include <cstddef>
#include <cstdint>

namespace fotomill {

// The inner loops of the filtered scaler. Samples between the two passes are 16-bit numbers of 1/64
// gray level; a weight is a 16-bit share of 2^shift, and the weights of a window add up to 2^shift.
// A window's weights are filled up with zeros to a whole number of kTapGroup.
inline constexpr int32_t kTapGroup = 4;
inline constexpr int32_t kFraction = 6;        // bits of a sample below one gray level
// samples: a row that is weighed has at least as many
inline constexpr int32_t kWeighedAtOnce = 64;

// The source pixels of each output pixel of a row or column.
struct FilterWindow {
  int32_t first;  // source pixel of the first weight
  int32_t taps;   // weights, a multiple of kTapGroup
  const int16_t* weights;
};

// One set of loops; every pointer is set.
struct ResampleKernels {
  // Adds up `window.taps` rows by weight: samples of whole gray levels, or of the fraction above.
  // `samples` are written, in blocks of kWeighedAtOnce of which the last may overlap the one
  // before.
  void (*weighBytes)(const uint8_t* const* rows, const FilterWindow& window, int32_t shift,
                     size_t samples, int16_t* sum);
  void (*weighShorts)(const int16_t* const* rows, const FilterWindow& window, int32_t shift,
                      size_t samples, int16_t* sum);
  // One row of `count` pixels from a row of pixels of three or four samples, which must be readable
  // up to the end of the last window and 16 bytes more. What is written may run 16 bytes over.
  void (*scaleThree)(const int16_t* row, const FilterWindow* windows, int32_t count, int32_t shift,
                     int16_t* pixels);
  void (*scaleFour)(const int16_t* row, const FilterWindow* windows, int32_t count, int32_t shift,
                    int16_t* pixels);
  // Gray levels to samples; and colors multiplied by their alpha to samples, four a pixel.
  void (*widen)(const uint8_t* levels, size_t count, int16_t* samples);
  void (*multiply)(const uint8_t* bgr, const uint8_t* alpha, size_t pixels, int16_t* samples);
  // Samples to gray levels, rounded.
  void (*narrow)(const int16_t* samples, size_t count, uint8_t* levels);
  // Adds samples to sums.
  void (*add)(const int16_t* samples, size_t count, int32_t* sums);
};

// The loops for this processor, and those that every processor of the build can run. Their results
// are the same.
const ResampleKernels& ResampleKernelsHere();
const ResampleKernels& BaselineResampleKernels();  // those that every processor can run

}  // namespace fotomill
