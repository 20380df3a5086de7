#pragma once

#include "picture/picture_record.h"
#include "picture/read_request.h"
#include "picture/write_options.h"

namespace fotomill {

// PC Paintbrush. For the file layout and this codec's quirks see pcx.cpp.

// Sets size, depth and palette of `picture`. Ok, FileOpenError; DamagedFile for a truncated header,
// a wrong signature, an unknown plane arrangement, or an invalid size; FileReadError if a palette
// at the end cannot be read.
Status PcxInfo(PictureRecord& picture, const ReadRequest& request);

// Calls PcxInfo and decodes the pixels into `image`. Statuses of PcxInfo; FileReadError if the data
// are truncated; MemoryAllocationError.
Status PcxRead(PictureRecord& picture, const ReadRequest& request);

// Writes `image` to picture.fileName as a version 5 file; pictures of 2 to 4 bits in as many
// planes. Ok; MemoryAllocationError if there is no image; UnsuitableImage for 65536 columns of more
// than 4 bits; ErrorCreatingFile, ErrorWritingFile.
Status PcxWrite(PictureRecord& picture, const WriteOptions& options);

}  // namespace fotomill
