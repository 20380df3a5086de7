#pragma once

#include "picture/picture_record.h"
#include "picture/read_request.h"
#include "picture/write_options.h"

namespace fotomill {

// CALS rasters of type 1. Statuses: FileOpenError (1), DamagedFile (2), FileReadError (3) if
// truncated, MemoryAllocationError (6), UnsupportedFormat (8) for tiled files.
Status CalsInfo(PictureRecord& picture, const ReadRequest& request);
Status CalsRead(PictureRecord& picture, const ReadRequest& request);
// Also TooManyColors (12) for pictures deeper than 1 bit, ErrorCreatingFile (10), ErrorWritingFile
// (11).
Status CalsWrite(PictureRecord& picture, const WriteOptions& options);

}  // namespace fotomill
