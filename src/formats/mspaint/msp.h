#pragma once

#include "picture/picture_record.h"
#include "picture/read_request.h"
#include "picture/write_options.h"

namespace fotomill {

// Microsoft Paint of Windows 1 and 2. Statuses: FileOpenError (1), DamagedFile (2), FileReadError
// (3) if truncated, MemoryAllocationError (6).
Status MspInfo(PictureRecord& picture, const ReadRequest& request);
Status MspRead(PictureRecord& picture, const ReadRequest& request);
// Also TooManyColors (12) for pictures deeper than 1 bit, UnsuitableImage (13) for packed rows of
// more than 65535 bytes, ErrorCreatingFile (10), ErrorWritingFile (11).
Status MspWrite(PictureRecord& picture, const WriteOptions& options);

}  // namespace fotomill
