#pragma once

#include <cstdint>

#include "core/progress.h"
#include "core/status.h"
#include "processing/bands.h"

namespace fotomill {

class PackedImage;
struct PictureRecord;

// Width and height of a picture or an image.
struct Size {
  int32_t width, height;  // pixels
};

// The largest size of the picture's aspect ratio inside a square of `side`, each edge rounded to
// nearest and at least 1. A smaller picture is enlarged.
Size FitSize(int32_t width, int32_t height, int32_t side);

// What both edges become at a percentage: edge x percentage / 100, rounded down, at least 1, at
// most 2^31 - 1.
Size SizeAtPercentage(int32_t width, int32_t height, int32_t percentage);

// How a pixel between others gets its value.
enum class ScaleFilter {
  Lanczos,   // windowed sinc of three lobes: the sharpest
  Bicubic,   // cubic convolution with a = -1/2 (Keys 1981)
  Bilinear,  // triangle
  Nearest,   // the nearest pixel as it is
  Box,       // the mean of the pixels that it covers
  Mitchell,  // cubic with B = C = 1/3 (Mitchell and Netravali 1988): softer than bicubic
};
// The filter that a value of the keys ResizeFilter and ThumbnailZoomFilter selects; beyond the
// list, its nearest entry.
ScaleFilter ScaleFilterFromKey(int32_t value);

// Scales by picking the source pixel under the middle of each new one. An image keeps its depth and
// colors; an alpha plane is an image like any other. Statuses as NewPackedImage.
Status ScaleNearest(const PackedImage& image, Size size, PackedImage& scaled);

// The quick scaler: both edges by one percentage, image and alpha plane of the picture, whose
// `width` and `height` follow. On failure the picture is unchanged.
Status ScalePictureByPercentage(PictureRecord& picture, int32_t percentage);

// The filtered scaler. Where the picture shrinks, the filter widens with it, so that every source
// pixel counts; windows are cut at the picture's edges; a pixel's color counts by its alpha.
// `alpha` may be empty, else it has the image's size. The result has 24 bits (with Nearest the
// image's own depth) and an alpha plane when there was one. Shrinking by 8 and more averages whole
// blocks of pixels first, so that a fourfold to eightfold reduction is left to the filter.
// Re-entrant; the same on every processor. Statuses as NewPackedImage; on failure the results are
// empty.
Status ScaleFiltered(const PackedImage& image, const PackedImage& alpha, Size size,
                     ScaleFilter filter, PackedImage& scaled, PackedImage& scaledAlpha,
                     ProgressSink* progress = nullptr);

// The same of a picture that ends within the last column and row of its image, as a reduced decode
// leaves it.
struct Reach {
  double width, height;  // of the picture, in pixels of the image
};
Status ScaleFiltered(const PackedImage& image, const PackedImage& alpha, Reach reach, Size size,
                     ScaleFilter filter, PackedImage& scaled, PackedImage& scaledAlpha,
                     ProgressSink* progress = nullptr);

// What else decides how a picture is scaled.
struct ScaleOptions {
  ScaleFilter filter = ScaleFilter::Bicubic;
  bool linear = false;    // computes with light instead of sRGB values (IEC 61966-2-1)
  // large reductions average blocks of pixels first; false: the filter sees every pixel
  bool blocks = true;
  Work work = {};
  ProgressSink* progress = nullptr;  // told when `work.threads` is 1
};
// The same in bands, as the options say. FunctionCancelled (4) when the work was stopped.
Status ScaleFiltered(const PackedImage& image, const PackedImage& alpha, Reach reach, Size size,
                     const ScaleOptions& options, PackedImage& scaled, PackedImage& scaledAlpha);
// The same for a picture, whose `width`, `height` and `bitsPerPixel` follow. On failure the picture
// is unchanged.
Status ScalePicture(PictureRecord& picture, Size size, const ScaleOptions& options);

// The same for a picture, whose `width`, `height` and `bitsPerPixel` follow. On failure the picture
// is unchanged.
Status ScalePicture(PictureRecord& picture, Size size, ScaleFilter filter);

}  // namespace fotomill
