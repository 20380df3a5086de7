#pragma once

#include <cstdint>
#include <functional>
#include <span>

#include "core/status.h"
#include "picture/picture_record.h"
#include "processing/bands.h"
#include "processing/geometry/canvas.h"
#include "processing/geometry/scale.h"

namespace fotomill {

// Computes a picture whose pixels come from arbitrary positions in another:
// rotation, perspective, distortion.

// A source position, in 1 / 2^30 of a pixel. (0, 0) is the center of the top left pixel.
inline constexpr int32_t kPlaceBits = 30;
struct SourcePlace {
  int64_t x, y;
};
// Converts from pixels; clamped far outside.
SourcePlace PlaceAt(double x, double y);

// Computes the source positions of row y of the result from column
// `left` on, one for each element of `places`. Called concurrently;
// a pixel's position must not depend on the others requested.
using PlaceRow = std::function<void(int32_t left, int32_t y, std::span<SourcePlace> places)>;

// Interpolation between pixel centers.
enum class WarpFilter : int32_t {
  Bicubic,   // cubic convolution with a = -1/2 (Keys 1981)
  Bilinear,
  Nearest,
};

struct WarpOptions {
  WarpFilter filter = WarpFilter::Bicubic;
  bool edgesRepeat = false;  // outside the picture; otherwise the backdrop is used
  Backdrop backdrop = {};
};

// Replaces the picture with one of `size` and 24 bits. Colors are weighted by alpha; a transparent
// backdrop adds an alpha plane. Statuses as NewPackedImage, FunctionCancelled, EmptyImage without a
// picture; the picture may be promoted then.
Status WarpPicture(PictureRecord& picture, Size size, const WarpOptions& options,
                   const PlaceRow& places, const Work& work);

// A linear map: column x, row y of the result comes from (xx x + xy y + x0, yx x + yy y + y0),
// relative to the centers of the top left pixels.
struct LinearMap {
  double xx, xy, x0, yx, yy, y0;
};
// The map as a PlaceRow function.
PlaceRow LinearPlaces(const LinearMap& map);

// The map for a transformation about the center, from a picture of size `from` to a result of size
// `to`. The four coefficients are the inverse transformation.
LinearMap MapAboutCenter(Size from, Size to, double xx, double xy, double yx, double yy);

}  // namespace fotomill
