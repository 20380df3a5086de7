#pragma once

#include <tiffio.h>

#include <cstdint>

#include "core/status.h"
#include "formats/tiff/tiff_samples.h"

namespace fotomill {

// How rows of a page are converted.
enum class TiffRows {
  Direct,   // as stored in the picture
  Nibbles,  // 2-bit values, expanded to 4 bits
  Gray,     // via bytes, one per pixel
  Colors,   // via bytes, to blue, green, red and alpha
  Library   // by the library
};

// A page, from its directory.
struct TiffLayout {
  uint32_t width = 0, height = 0;  // pixels
  TiffSampleForm form;
  uint16_t samples = 1, colors = 1;           // per pixel, and number of color samples
  uint16_t photometric = 0, compression = 0;  // TIFF constants
  bool separate = false;                      // each sample has separate strips or tiles
  bool tiled = false;
  uint32_t bandHeight = 0;  // rows per strip or tile
  uint32_t tileWidth = 0;
  int alpha = -1;           // index of the alpha sample
  bool multiplied = false;  // premultiplied colors
  TiffRows rows = TiffRows::Library;
  int32_t bitsPerPixel = 24;  // of the picture: 1, 4, 8 or 24
};

// The value of a tag in the current directory, or its default. `T` is the library's type
// for the tag.
template <typename T>
T TiffField(TIFF* tiff, uint32_t tag) {
  T value = 0;
  TIFFGetFieldDefaulted(tiff, tag, &value);
  return value;
}

// Reads the current directory, and sets up the library to decode JPEG as RGB. Ok, or DamagedFile
// (2) for a directory without pixels.
Status ReadTiffLayout(TIFF* tiff, TiffLayout& layout);

}  // namespace fotomill
