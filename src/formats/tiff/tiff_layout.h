#pragma once

#include <tiffio.h>

#include <cstdint>

#include "core/status.h"
#include "formats/tiff/tiff_samples.h"

namespace fotomill {

// How the rows of a page become the picture's.
enum class TiffRows {
  Direct,   // as the picture stores them
  Nibbles,  // 2-bit values, to become 4-bit ones
  Gray,     // through bytes, one of them a pixel
  Colors,   // through bytes, to blue, green, red and alpha
  Library   // the library's own conversion
};

// A page as its directory describes it.
struct TiffLayout {
  uint32_t width = 0, height = 0;  // pixels
  TiffSampleForm form;
  uint16_t samples = 1, colors = 1;           // of a pixel, and how many of them are colors
  uint16_t photometric = 0, compression = 0;  // numbers of the format
  bool separate = false;                      // each sample has strips or tiles of its own
  bool tiled = false;
  uint32_t bandHeight = 0;  // rows of a strip or tile
  uint32_t tileWidth = 0;
  int alpha = -1;           // the sample that is alpha
  bool multiplied = false;  // colors were multiplied by alpha
  TiffRows rows = TiffRows::Library;
  int32_t bitsPerPixel = 24;  // of the picture: 1, 4, 8 or 24
};

// The value of a tag of the directory that is open, its default where the file does not have it.
// `T` is what the library stores for the tag.
template <typename T>
T TiffField(TIFF* tiff, uint32_t tag) {
  T value = 0;
  TIFFGetFieldDefaulted(tiff, tag, &value);
  return value;
}

// Reads the directory that is open, and makes the library decode JPEG as RGB. Ok, or DamagedFile
// (2) for a directory without pixels.
Status ReadTiffLayout(TIFF* tiff, TiffLayout& layout);

}  // namespace fotomill
