#pragma once

#include <cstdint>
#include <span>
#include <vector>

#include "core/status.h"
#include "picture/rectangle.h"

namespace fotomill {

// The bitmaps of a Macintosh picture, as views
// into the file. For the layout see pict_file.cpp.

// A bitmap drawn by an opcode.
struct PictPixels {
  size_t rowBytes = 0;   // unpacked
  Rectangle bounds;      // of the stored rows
  Rectangle source;      // the part of them to draw
  Rectangle target;      // destination, in the picture's coordinates
  int32_t bits = 1;      // per pixel: 1, 2, 4, 8 with colors, 16 and 32 without
  // for 16 and 32 bits: 1 none, 2 without the fourth byte, 3 by pixels, 4 by components
  int32_t packType = 0;
  int32_t parts = 3;     // components of a 32-bit pixel: three colors, optionally a fourth
  bool packed = false;   // each row is preceded by its size
  bool longCounts = false;  // in 2 bytes
  bool inverted = false;                // a bitmap without colors: 1 is black
  std::span<const uint8_t> colorTable;  // index, red, green, blue, 2 bytes each
  bool tableInOrder = false;            // the indices in the table are ignored
  std::span<const uint8_t> data;        // of all rows
  // `data` is a JPEG file; of the fields above only `target` is used
  bool jpeg = false;

  bool Indexed() const { return !jpeg && bits <= 8; }  // pixels are palette indices
};

// The parsed file: its frame, and the bitmaps in drawing order.
struct PictFile {
  int32_t version = 1;
  Rectangle frame;
  std::vector<PictPixels> pixels;
  int32_t drawings = 0;     // opcodes that draw something else
  int32_t unsupported = 0;  // bitmaps in an unsupported format
  bool cutShort = false;    // the file is truncated within an opcode
};

// FileReadError for a truncated header, DamagedFile.
Status ParsePict(std::span<const uint8_t> file, PictFile& pict);

}  // namespace fotomill
