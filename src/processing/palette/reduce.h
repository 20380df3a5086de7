#pragma once

#include <cstdint>

#include "core/status.h"
#include "picture/picture_record.h"

namespace fotomill {

// How the colors that a palette lacks are imitated: the values of the keys FXColorDither (4 and 8 bits) and FXMonoDither
// (1 bit).
enum class Dither : int32_t {
  None = 0,            // each pixel takes the nearest color, or is cut at the threshold
  Ordered = 1,         // a fixed pattern of 8 x 8 thresholds (Bayer 1973)
  FloydSteinberg = 2,  // each pixel's error goes to its neighbours (Floyd and Steinberg 1976)
};

// How colors are reduced; ReduceColors without options takes them from the keys.
struct ReduceOptions {
  Dither colorDither = Dither::FloydSteinberg;
  Dither monoDither = Dither::FloydSteinberg;
  bool serpentine = true;  // Floyd-Steinberg takes every other row from right to left
  bool grays = false;      // evenly spaced grays in place of a fitted palette
  int32_t grayLevels = 0;  // with `grays`: number of grays, 2 to 256; 0 for as many as the depth holds
  int32_t threshold = 0;   // 1 bit without dithering: the darkest brightness that becomes white, 1 to 255; 0: the
                           // limit that parts the picture's brightnesses best (Otsu 1979)
  int32_t brightness = 0;  // added before reducing to fewer colors than there are, -100 to 100 per cent of white
  int32_t contrast = 0;    // spread about middle gray before that, -100 (all gray) to 100 per cent (doubled)
};

// Brings a picture down to at most `maxBits`: to 8, 4 or 1 bits per pixel, whichever is the deepest that fits, and leaves
// `image`, `palette` and `bitsPerPixel` consistent. A picture that fits already stays as it is. Alpha is flattened first.
// Where the picture uses few enough colors, they are kept exactly and nothing is dithered; otherwise a palette is fitted
// to the picture (black and white for 1 bit) and the pixels are dithered as the options say. Without a picture:
// EmptyImage. MemoryAllocationError when a block cannot be had; `image` is then whole, but may be flattened.
Status ReduceColors(PictureRecord& picture, int32_t maxBits, const ReduceOptions& options);

}  // namespace fotomill
