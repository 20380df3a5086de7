#pragma once

#include <cstdint>

#include "core/status.h"
#include "picture/picture_record.h"
#include "processing/bands.h"
#include "processing/geometry/warp.h"

namespace fotomill {

// Distortions. The size stays, edges repeat, pixels are sampled by bicubic interpolation. Centers
// are in pixels from the top left corner. Statuses as WarpPicture.

// Where a part of a picture that is computed alone is in the whole.
struct WarpOrigin {
  int32_t left = 0, top = 0;
};

// Rings around a center, `wavelength` pixels apart: pixels move along the radius by `amplitude`
// sin(2 pi r / wavelength).
Status RipplePicture(PictureRecord& picture, double amplitude, double wavelength, double centerX,
                     double centerY, const WarpOrigin& origin, const Work& work);

// Columns move down by `amplitude` sin(2 pi x / wavelength), or rows to the right.
Status WavePicture(PictureRecord& picture, double amplitude, double wavelength, bool columns,
                   const WarpOrigin& origin, const Work& work);

// How far ripples and waves reach.
int32_t WaveReach(double amplitude);

// Turns by `degrees` clockwise at the center, less further out by (1 - r / radius)^2, and not at
// all from `radius` on.
Status SwirlPicture(PictureRecord& picture, double degrees, double centerX, double centerY,
                    double radius, const Work& work);

// Enlarges the center, or shrinks it with a negative amount, from -1 to 1: a pixel at r comes from
// r (1 - amount (1 - t^2)^2), t = r / radius.
Status BulgePicture(PictureRecord& picture, double amount, double centerX, double centerY,
                    double radius, const Work& work);

}  // namespace fotomill
