#pragma once

#include <cstdint>

#include "core/status.h"
#include "picture/palette.h"
#include "processing/bands.h"
#include "processing/palette/dither.h"

namespace fotomill {

struct PictureRecord;

// How colors are reduced; ReduceColors without options takes them from the keys.
struct ReduceOptions {
  Dither colorDither = Dither::FloydSteinberg;
  Dither monoDither = Dither::FloydSteinberg;
  bool serpentine = true;  // Floyd-Steinberg takes every other row from right to left
  bool grays = false;      // evenly spaced grays in place of a fitted palette
  // with `grays`: number of grays, 2 to 256; 0 for as many as the depth holds
  int32_t grayLevels = 0;
  int32_t threshold =
      0;  // 1 bit without dithering: the darkest brightness that becomes white, 1 to 255; 0: the
          // limit that parts the picture's brightnesses best (Otsu 1979)
  // added before reducing to fewer colors than there are, -100 to 100 per cent of white
  int32_t brightness = 0;
  // spread about middle gray before that, -100 (all gray) to 100 per cent (doubled)
  int32_t contrast = 0;
};

// Brings a picture down to at most `maxBits`: to 8, 4 or 1 bits per pixel, whichever is the deepest
// that fits, and leaves `image`, `palette` and `bitsPerPixel` consistent. A picture that fits
// already stays as it is. Alpha is flattened first. Where the picture uses few enough colors, they
// are kept exactly and nothing is dithered; otherwise a palette is fitted to the picture (black and
// white for 1 bit) and the pixels are dithered as the options say. Without a picture: EmptyImage.
// MemoryAllocationError when a block cannot be had; `image` is then whole, but may be flattened.
Status ReduceColors(PictureRecord& picture, int32_t maxBits, const ReduceOptions& options);

// Which colors a picture gets.
struct PaletteChoice {
  enum class Kind : uint8_t {
    Fitted,  // the colors that suit the picture best
    Grays,   // evenly spaced from black to white
    Given,   // those of `given`
  };
  Kind kind = Kind::Fitted;
  int32_t colors = 256;  // 2 to 256: the most of a fitted palette, else the number there is
  Palette given{};
};

// Brings a picture of any depth down to a palette: to 1, 4 or 8 bits, as few as its colors need,
// dithered as the options say. Where a fitted palette would hold all colors that the picture has,
// they are kept exactly. Alpha stays. Errors are diffused in full unless the palette is fitted.
// EmptyImage (31), MemoryAllocationError (6), FunctionCancelled (4); the picture is unchanged then.
Status ReduceToPalette(PictureRecord& picture, const PaletteChoice& choice,
                       const ReduceOptions& options, const Work& work);

// The same to black and white at 1 bit, by the luma; `threshold`, `monoDither`, `serpentine`,
// `brightness` and `contrast` of the options count.
Status ReduceToMono(PictureRecord& picture, const ReduceOptions& options, const Work& work);

}  // namespace fotomill
