#pragma once

#include <cstddef>
#include <cstdint>
#include <span>
#include <string>
#include <vector>

#include "core/status.h"
#include "core/workers/stop_token.h"
#include "picture/rectangle.h"
#include "processing/geometry/orient.h"
#include "processing/geometry/scale.h"
#include "texts/texts.h"

namespace fotomill {

// A JPEG picture rotated or cropped losslessly: its coefficients are rearranged without decoding.
struct TurnedJpeg {
  // a JPEG file without application segments and comments; empty if there is an obstacle
  std::vector<uint8_t> file;
  int32_t width = 0, height = 0;  // of the rotated picture
  bool trimmed = false;           // partial blocks at the edges were cut off
  size_t end = 0;                 // offset in the old file after the picture; other data may follow
  // why lossless rotation is impossible, as a sentence; the picture itself is valid
  RecordedText obstacle;
};

// Rotates the picture of a JPEG file. Edges can only move in whole blocks (8 pixels, 16 with
// chroma subsampling): a partial block at an edge that moves to the start is an obstacle; with
// `trim`, up to 15 rows or columns of pixels are cut off instead. Progressive pictures stay
// progressive. Statuses of reading; FileReadError (3) for truncated files, FunctionCancelled (4)
// if `stop` was requested.
Status TurnJpeg(std::span<const uint8_t> file, Orientation orientation, bool trim,
                const StopToken& stop, TurnedJpeg& turned);

// Crops the picture of a JPEG file to `area`, in pixels as stored, clipped to the picture. Its left
// and top edge must lie between blocks, else that is an obstacle. Statuses as above.
Status CropJpeg(std::span<const uint8_t> file, const Rectangle& area, const StopToken& stop,
                TurnedJpeg& cropped);
// The size of a JPEG picture, and of the blocks between which it can be cropped, 8 or more pixels.
struct JpegGrid {
  Size picture{0, 0}, block{0, 0};
};
// Statuses of reading the header.
Status ReadJpegGrid(std::span<const uint8_t> file, JpegGrid& grid);

}  // namespace fotomill
