#pragma once

#include <cstdint>

#include "core/status.h"
#include "picture/picture_record.h"
#include "processing/bands.h"

namespace fotomill {

// Random effects. The result for a pixel depends only on the seed and its position, so that neither
// threads nor tiling affect it. `left`, `top`: position of the picture in the whole. Statuses:
// EmptyImage, MemoryAllocationError, FunctionCancelled.

// 64 random bits for a position. Source: G. Steele, D. Lea and C. Flood, "Fast Splittable
// Pseudorandom Number Generators" (2014).
uint64_t RandomAt(uint64_t seed, int32_t x, int32_t y);

enum class NoiseKind : int32_t {
  Uniform,     // levels change by at most `amount` percent of 255
  Gaussian,    // normally distributed, with a standard deviation of `amount` percent of 255
  SaltPepper,  // `amount` percent of the pixels become black or white
};
struct NoiseOptions {
  NoiseKind kind = NoiseKind::Gaussian;
  double amount = 10;  // 0 to 100
  bool gray = false;   // the same for all channels
  uint32_t seed = 1;
  int32_t left = 0, top = 0;
};
// In place, row by row; alpha is unchanged.
// FunctionCancelled leaves some rows changed.
Status AddNoise(PictureRecord& picture, const NoiseOptions& options, const Work& work);

// Replaces each pixel, including alpha, by a random one at most `radius` away in each direction;
// edges are repeated.
Status SpreadPicture(PictureRecord& picture, int32_t radius, uint32_t seed, int32_t left,
                     int32_t top, const Work& work);

}  // namespace fotomill
