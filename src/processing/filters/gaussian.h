#pragma once

#include <cstdint>

#include "core/status.h"
#include "picture/picture_record.h"
#include "processing/bands.h"

namespace fotomill {

// Gaussian blur and what is made of it. Pixels outside the picture repeat its edge; a color counts
// by its alpha.
//
// The Gaussian is sampled at pixel centers out to 4 sigma and its weights add up to 1. From sigma 3
// on it is computed in two steps whose cost does not depend on sigma: a Gaussian of sigma / sqrt 2
// at every d-th pixel, d = 0.7 sigma, then a second one between those. Two Gaussians make one of
// the sum of their variances; as d is small beside them, what the coarse grid adds is below 1/50 of
// a level.

// Where a part of a picture that is computed alone is in the whole: makes the grid the same in
// both.
struct GaussianPlace {
  int32_t left = 0, top = 0;
};

// How far away a pixel may be and still count.
int32_t GaussianReach(double sigma);

// Blurs a picture; the result has 24 bits. Alpha is blurred as well. Sigma from 0.1 to 1000.
// Statuses: EmptyImage, MemoryAllocationError, FunctionCancelled; the picture is then unchanged, or
// promoted.
Status BlurPicture(PictureRecord& picture, double sigma, const GaussianPlace& place,
                   const Work& work);

// v + amount (v - blur) where |v - blur| >= threshold levels, else v; the blur is not rounded.
// `amount` 1 is 100 %.
Status UnsharpPicture(PictureRecord& picture, double sigma, double amount, double threshold,
                      const GaussianPlace& place, const Work& work);

}  // namespace fotomill
