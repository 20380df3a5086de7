#pragma once

#include <cstdint>
#include <span>
#include <vector>

#include "core/status.h"
#include "picture/rectangle.h"

namespace fotomill {

// What of a Macintosh picture can be shown, as views into the file. The layout is described in
// pict_file.cpp.

struct PictPixels {
  size_t rowBytes = 0;   // of an unpacked row
  Rectangle bounds;      // of the stored rows
  Rectangle source;      // the part of them that is drawn
  Rectangle target;      // where, in the picture's coordinates
  int32_t bits = 1;      // of a pixel: 1, 2, 4, 8 with colors, 16 and 32 without
  // of 16 and 32 bits: 1 none, 2 without the fourth byte, 3 by pixels, 4 by colors
  int32_t packType = 0;
  int32_t parts = 3;     // colors, and perhaps a fourth part, of a pixel of 32 bits
  bool packed = false;   // each row after the number of its bytes
  bool longCounts = false;  // which takes 2 bytes
  bool inverted = false;                // a bitmap without colors: 1 is black
  std::span<const uint8_t> colorTable;  // index, red, green, blue, 2 bytes each
  bool tableInOrder = false;            // the indices do not count
  std::span<const uint8_t> data;        // of all rows
  // `data` is a JPEG file, and of the facts above only `target` counts
  bool jpeg = false;

  bool Indexed() const { return !jpeg && bits <= 8; }
};

struct PictFile {
  int32_t version = 1;
  Rectangle frame;
  std::vector<PictPixels> pixels;
  int32_t drawings = 0;     // operations that draw something else
  int32_t unsupported = 0;  // pixels of a kind that is not decoded
  bool cutShort = false;    // the file ended within an operation
};

// FileReadError for a file that ends within its header, DamagedFile.
Status ParsePict(std::span<const uint8_t> file, PictFile& pict);

}  // namespace fotomill
