#pragma once

#include <cstdint>

#include "core/status.h"
#include "picture/picture_record.h"
#include "processing/bands.h"
#include "processing/geometry/warp.h"

namespace fotomill {

// Distortions. The size is unchanged, edges are repeated, sampling is bicubic. Centers are in
// pixels from the top left corner. Statuses as WarpPicture.

// Position of a separately computed part in the whole picture.
struct WarpOrigin {
  int32_t left = 0, top = 0;
};

// Rings around a center, `wavelength` pixels apart: pixels move radially by `amplitude` sin(2 pi r
// / wavelength).
Status RipplePicture(PictureRecord& picture, double amplitude, double wavelength, double centerX,
                     double centerY, const WarpOrigin& origin, const Work& work);

// Shifts columns down by `amplitude` sin(2 pi x / wavelength), or rows to the right.
Status WavePicture(PictureRecord& picture, double amplitude, double wavelength, bool columns,
                   const WarpOrigin& origin, const Work& work);

// Maximum displacement of ripples and waves.
int32_t WaveReach(double amplitude);

// Rotates clockwise by `degrees` at the center, decreasing by (1 - r / radius)^2 to
// none at `radius`.
Status SwirlPicture(PictureRecord& picture, double degrees, double centerX, double centerY,
                    double radius, const Work& work);

// Magnifies the center, or shrinks it if the amount, from -1 to 1, is negative: a pixel at r is
// taken from r (1 - amount (1 - t^2)^2), t = r / radius.
Status BulgePicture(PictureRecord& picture, double amount, double centerX, double centerY,
                    double radius, const Work& work);

}  // namespace fotomill
