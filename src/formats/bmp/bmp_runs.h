#pragma once

#include <cstdint>
#include <span>

#include "core/byte_writer.h"
#include "core/status.h"
#include "picture/packed_image.h"
#include "picture/picture_record.h"
#include "platform/file_view.h"

namespace fotomill {

// Run-length data of bitmaps: RLE8, whose values are single pixels, and RLE4 with two pixels each.
//
//   n v            n pixels of value v; RLE4 takes its halves in turn
//   0 0            end of line
//   0 1            end of bitmap
//   0 2 dx dy      move right and up
//   0 n data...    n pixels (n from 3) as they are, padded to an even number of bytes
//
// Source: Microsoft, "Bitmap Compression", Windows GDI reference.
struct BmpRuns {
  uint64_t offset = 0;   // of the first code in the file
  bool halves = false;   // RLE4
  bool topDown = false;  // the first line is the top one
};

// Decodes into the zero-filled rows of `image`, whatever its depth; pixels outside are dropped.
// FileReadError when the data end before an end of bitmap, FunctionCancelled.
Status DecodeBmpRuns(platform::FileView& file, const BmpRuns& runs, const PictureRecord& picture,
                     PackedImage& image);

// Writes the RLE8 code of a row of indices, one a byte, without the end of its line.
void EncodeRle8Row(std::span<const uint8_t> row, ByteWriter& out);

}  // namespace fotomill
