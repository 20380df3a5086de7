#pragma once

#include <cstdint>

#include "core/status.h"
#include "picture/palette.h"
#include "processing/bands.h"
#include "processing/palette/dither.h"

namespace fotomill {

struct PictureRecord;

// Options of color reduction; ReduceColors without options uses the settings.
struct ReduceOptions {
  Dither colorDither = Dither::FloydSteinberg;
  Dither monoDither = Dither::FloydSteinberg;
  bool serpentine = true;  // Floyd-Steinberg scans every other row from right to left
  bool grays = false;      // evenly spaced grays instead of a fitted palette
  // with `grays`: number of grays, 2 to 256; 0: as many as the depth allows
  int32_t grayLevels = 0;
  int32_t threshold =
      0;  // 1 bit without dithering: the lowest luma that becomes white, 1 to 255; 0: automatic
          // (Otsu 1979)
  // added before reducing the colors, -100 to 100 percent of white
  int32_t brightness = 0;
  // applied around middle gray before that, -100 (all gray) to 100 percent (doubled)
  int32_t contrast = 0;
};

// Reduces a picture to at most `maxBits`: to 8, 4 or 1 bits per pixel, whichever is the deepest
// that fits, and keeps `image`, `palette` and `bitsPerPixel` consistent. Pictures that already fit
// are unchanged. Alpha is flattened first. If there are few enough colors, they are kept exactly
// and without dithering; otherwise a palette is fitted to the picture (black and white for 1 bit)
// and the pixels are dithered according to the options. EmptyImage without a picture.
// MemoryAllocationError if memory runs out; `image` is then valid, but may be flattened.
Status ReduceColors(PictureRecord& picture, int32_t maxBits, const ReduceOptions& options);

// The palette to reduce to.
struct PaletteChoice {
  enum class Kind : uint8_t {
    Fitted,  // optimized for the picture
    Grays,   // evenly spaced from black to white
    Given,   // the palette `given`
  };
  Kind kind = Kind::Fitted;
  int32_t colors = 256;  // 2 to 256: maximum for a fitted palette, else the exact number
  Palette given{};
};

// Reduces a picture of any depth to a palette: to 1, 4 or 8 bits, the fewest for its colors,
// dithered according to the options. If a fitted palette can hold all colors of the picture, they
// are kept exactly. Alpha is unchanged. Errors are fully diffused unless the palette is fitted.
// EmptyImage (31), MemoryAllocationError (6), FunctionCancelled (4); the picture is unchanged then.
Status ReduceToPalette(PictureRecord& picture, const PaletteChoice& choice,
                       const ReduceOptions& options, const Work& work);

// As above, to black and white at 1 bit, by luma; of the options, `threshold`, `monoDither`,
// `serpentine`, `brightness` and `contrast` are used.
Status ReduceToMono(PictureRecord& picture, const ReduceOptions& options, const Work& work);

}  // namespace fotomill
