#pragma once

#include <cstdint>

#include "core/status.h"
#include "picture/picture_record.h"
#include "processing/bands.h"

namespace fotomill {

// Gaussian blur, and effects based on it. The picture's edge is repeated; colors are weighted by
// alpha.
//
// The Gaussian is sampled at pixel centers out to 4 sigma, with weights adding up to 1. From sigma
// 3 on it is computed in two passes in constant time: a Gaussian of sigma / sqrt 2 at every d-th
// pixel, d = 0.7 sigma, then a second one to interpolate. Variances of successive Gaussians add up;
// as d is small compared to sigma, the error of the coarse grid is below 1/50 of a level.

// Position of a separately computed part in the
// whole picture: makes the coarse grids match.
struct GaussianPlace {
  int32_t left = 0, top = 0;
};

// The maximum distance of pixels that affect a result.
int32_t GaussianReach(double sigma);

// Blurs a picture, including alpha; the result has 24 bits. Sigma
// from 0.1 to 1000. Statuses: EmptyImage, MemoryAllocationError,
// FunctionCancelled; the picture is then unchanged, or promoted.
Status BlurPicture(PictureRecord& picture, double sigma, const GaussianPlace& place,
                   const Work& work);

// v + amount (v - blur) if |v - blur| >= threshold levels, else v; the blur is not rounded.
// `amount` 1 is 100 %.
Status UnsharpPicture(PictureRecord& picture, double sigma, double amount, double threshold,
                      const GaussianPlace& place, const Work& work);

}  // namespace fotomill
