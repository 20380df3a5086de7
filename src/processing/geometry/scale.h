#pragma once

#include <cstdint>

#include "core/progress.h"
#include "core/status.h"
#include "processing/bands.h"

namespace fotomill {

class PackedImage;
struct PictureRecord;

// Size of a picture or an image.
struct Size {
  int32_t width, height;  // pixels
};

// The largest size with the picture's aspect ratio that fits into a square of `side`, each edge
// rounded to nearest and at least 1. Smaller pictures are enlarged.
Size FitSize(int32_t width, int32_t height, int32_t side);

// The size at a percentage: edge x percentage /
// 100, rounded down, at least 1, at most 2^31 - 1.
Size SizeAtPercentage(int32_t width, int32_t height, int32_t percentage);

// Interpolation filters.
enum class ScaleFilter {
  Lanczos,   // windowed sinc with three lobes: the sharpest
  Bicubic,   // cubic convolution with a = -1/2 (Keys 1981)
  Bilinear,  // triangle
  Nearest,   // nearest neighbor
  Box,       // the mean of the covered pixels
  Mitchell,  // cubic with B = C = 1/3 (Mitchell and Netravali 1988): softer than bicubic
};
// The filter for a value of the keys ResizeFilter
// and ThumbnailZoomFilter, clamped to the list.
ScaleFilter ScaleFilterFromKey(int32_t value);

// Scales by nearest neighbor, at pixel centers. An image keeps its depth and colors; alpha planes
// are scaled the same way. Statuses as NewPackedImage.
Status ScaleNearest(const PackedImage& image, Size size, PackedImage& scaled);

// The quick scaler: scales image and alpha plane by a percentage, and sets `width` and `height`. On
// failure the picture is unchanged.
Status ScalePictureByPercentage(PictureRecord& picture, int32_t percentage);

// The filtered scaler. When shrinking, the filter is widened, so that every
// source pixel contributes; windows are clipped to the picture; colors are
// weighted by alpha. `alpha` may be empty, else it has the image's size. The
// result has 24 bits (with Nearest, the image's own depth) and an alpha plane
// if there was one. Reductions by 8 or more average blocks of pixels first,
// leaving a factor of 4 to 8 to the filter. Reentrant; the same on every
// processor. Statuses as NewPackedImage; on failure the results are empty.
Status ScaleFiltered(const PackedImage& image, const PackedImage& alpha, Size size,
                     ScaleFilter filter, PackedImage& scaled, PackedImage& scaledAlpha,
                     ProgressSink* progress = nullptr);

// The size of a picture that ends within the last column and row of its image, as after a
// reduced-size decode.
struct Reach {
  double width, height;  // in pixels of the image
};
// Of a record: width and height divided by `reduction`; the whole image unless it is a reduced
// decode.
Reach ReachOf(const PictureRecord& picture);
// Width and height of the picture itself, even if `image` is a reduced decode.
Size FullSizeOf(const PictureRecord& picture);
Status ScaleFiltered(const PackedImage& image, const PackedImage& alpha, Reach reach, Size size,
                     ScaleFilter filter, PackedImage& scaled, PackedImage& scaledAlpha,
                     ProgressSink* progress = nullptr);

// Further options for scaling.
struct ScaleOptions {
  ScaleFilter filter = ScaleFilter::Bicubic;
  bool linear = false;    // works in linear light instead of sRGB (IEC 61966-2-1)
  // large reductions average blocks of pixels first; false: filter every pixel
  bool blocks = true;
  Work work = {};
  ProgressSink* progress = nullptr;  // used if `work.threads` is 1
};
// As above, in bands, with options. FunctionCancelled (4) if the work was stopped.
Status ScaleFiltered(const PackedImage& image, const PackedImage& alpha, Reach reach, Size size,
                     const ScaleOptions& options, PackedImage& scaled, PackedImage& scaledAlpha);
// As above, for a picture, which may be a reduced decode; sets `width`, `height` and
// `bitsPerPixel`. On failure the picture is unchanged.
Status ScalePicture(PictureRecord& picture, Size size, const ScaleOptions& options);

// As above, with a filter and default
// options.
Status ScalePicture(PictureRecord& picture, Size size, ScaleFilter filter);

}  // namespace fotomill
