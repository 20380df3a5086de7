#pragma once

#include "picture/picture_record.h"
#include "picture/read_request.h"
#include "picture/write_options.h"

namespace fotomill {

// Wireless bitmaps. Statuses: FileOpenError (1), DamagedFile (2), FileReadError (3) if truncated,
// MemoryAllocationError (6), UnsupportedFormat (8) for types other than 0.
Status WbmpInfo(PictureRecord& picture, const ReadRequest& request);
Status WbmpRead(PictureRecord& picture, const ReadRequest& request);
// Also ErrorCreatingFile (10), ErrorWritingFile (11), TooManyColors (12) for pictures deeper than 1
// bit.
Status WbmpWrite(PictureRecord& picture, const WriteOptions& options);

}  // namespace fotomill
