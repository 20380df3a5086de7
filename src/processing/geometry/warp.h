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

// Makes a picture whose pixels come from anywhere in another one: rotation, perspective,
// distortion.

// A place in the source, in 1 / 2^30 of a pixel. (0, 0) is the center of the top left pixel.
inline constexpr int32_t kPlaceBits = 30;
struct SourcePlace {
  int64_t x, y;
};
// From pixels; far outside, it is only known to be outside.
SourcePlace PlaceAt(double x, double y);

// Where the pixels of row y of the result from column `left` on come from: as many as there are
// `places`. Called from several threads at a time; a pixel's place must not depend on which others
// are asked for.
using PlaceRow = std::function<void(int32_t left, int32_t y, std::span<SourcePlace> places)>;

// How the color between the centers of pixels is found.
enum class WarpFilter : int32_t {
  Bicubic,   // cubic convolution with a = -1/2 (Keys 1981)
  Bilinear,
  Nearest,
};

struct WarpOptions {
  WarpFilter filter = WarpFilter::Bicubic;
  bool edgesRepeat = false;  // beyond the edges; else the backdrop is there
  Backdrop backdrop = {};
};

// Replaces the picture by one of `size` and 24 bits. A pixel's color counts by its alpha; a
// transparent backdrop brings an alpha plane. Statuses as NewPackedImage, FunctionCancelled,
// EmptyImage without a picture; the picture may be promoted then.
Status WarpPicture(PictureRecord& picture, Size size, const WarpOptions& options,
                   const PlaceRow& places, const Work& work);

// Places of a linear map: column x, row y of the result comes from (xx x + xy y + x0, yx x + yy y +
// y0), all counted from the centers of the top left pixels.
struct LinearMap {
  double xx, xy, x0, yx, yy, y0;
};
// The same as a function of rows.
PlaceRow LinearPlaces(const LinearMap& map);

// The map of a result of size `to` that is the picture of size `from` transformed about its center,
// which stays the center. The four numbers are the inverse transformation.
LinearMap MapAboutCenter(Size from, Size to, double xx, double xy, double yx, double yy);

}  // namespace fotomill
