#pragma once

#include <cstdint>
#include <span>

#include "core/byte_writer.h"
#include "core/status.h"
#include "picture/packed_image.h"
#include "picture/picture_record.h"
#include "platform/file_view.h"

namespace fotomill {

// Run-length encoding of bitmaps: RLE8 with one pixel per value, RLE4 with two.
//
//   n v            n pixels of value v; RLE4 alternates its halves
//   0 0            end of line
//   0 1            end of bitmap
//   0 2 dx dy      move right and up
//   0 n data...    n literal pixels (n >= 3), padded to an even number of bytes
//
// Source: Microsoft, "Bitmap Compression", Windows GDI reference.
struct BmpRuns {
  uint64_t offset = 0;   // file offset of the first code
  bool halves = false;   // RLE4
  bool topDown = false;  // the first line is the top one
};

// Decodes into the zeroed rows of `image`, at any depth; pixels outside are ignored. FileReadError
// if the data end without an end-of-bitmap code, FunctionCancelled.
Status DecodeBmpRuns(platform::FileView& file, const BmpRuns& runs, const PictureRecord& picture,
                     PackedImage& image);

// Writes a row of one-byte indices as RLE8, without an end-of-line code.
void EncodeRle8Row(std::span<const uint8_t> row, ByteWriter& out);

}  // namespace fotomill
