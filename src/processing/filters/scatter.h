#pragma once

#include <cstdint>

#include "core/status.h"
#include "picture/picture_record.h"
#include "processing/bands.h"

namespace fotomill {

// Effects of chance. What becomes of a pixel depends on the seed and its place alone, so neither
// threads nor the part of a picture that is computed matter. `left`, `top`: the place of the
// picture in the whole. Statuses: EmptyImage, MemoryAllocationError, FunctionCancelled.

// 64 random bits for a place. Source: G. Steele, D. Lea and C. Flood, "Fast Splittable Pseudorandom
// Number Generators" (2014).
uint64_t RandomAt(uint64_t seed, int32_t x, int32_t y);

enum class NoiseKind : int32_t {
  Uniform,     // levels change by at most `amount` per cent of 255
  Gaussian,    // by numbers whose standard deviation is `amount` per cent of 255
  SaltPepper,  // `amount` per cent of the pixels become black or white
};
struct NoiseOptions {
  NoiseKind kind = NoiseKind::Gaussian;
  double amount = 10;  // 0 to 100
  bool gray = false;   // the same for all channels
  uint32_t seed = 1;
  int32_t left = 0, top = 0;
};
// Changes the picture in place, row by row; alpha stays. After FunctionCancelled some rows are
// changed.
Status AddNoise(PictureRecord& picture, const NoiseOptions& options, const Work& work);

// Each pixel becomes one that is at most `radius` away along both edges, alpha included; edges
// repeat.
Status SpreadPicture(PictureRecord& picture, int32_t radius, uint32_t seed, int32_t left,
                     int32_t top, const Work& work);

}  // namespace fotomill
