#pragma once

#include "picture/picture_record.h"
#include "picture/read_request.h"
#include "picture/write_options.h"

namespace fotomill {

// PC Paintbrush. The file layout, and what is peculiar to this codec, is described in pcx.cpp.

// Fills the facts of `picture`: size, depth, palette. Ok, FileOpenError; DamagedFile for a short
// header, another signature, an unknown arrangement of planes, or a size that leaves nothing to
// decode; FileReadError when a palette at the end cannot be read.
Status PcxInfo(PictureRecord& picture, const ReadRequest& request);

// Fills the facts and decodes the pixels into `image`. Statuses of PcxInfo; FileReadError when the
// data end early; MemoryAllocationError.
Status PcxRead(PictureRecord& picture, const ReadRequest& request);

// Writes `image` to picture.fileName as a version 5 file; pictures of 2 to 4 bits in as many
// planes. Ok; MemoryAllocationError when there is no image; UnsuitableImage for 65536 columns of
// more than 4 bits; ErrorCreatingFile, ErrorWritingFile.
Status PcxWrite(PictureRecord& picture, const WriteOptions& options);

}  // namespace fotomill
