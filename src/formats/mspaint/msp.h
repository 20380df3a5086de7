#pragma once

#include "picture/picture_record.h"
#include "picture/read_request.h"
#include "picture/write_options.h"

namespace fotomill {

// Microsoft Paint of Windows 1 and 2. Statuses: FileOpenError (1), DamagedFile (2), FileReadError
// (3) when data are cut short, MemoryAllocationError (6).
Status MspInfo(PictureRecord& picture, const ReadRequest& request);
Status MspRead(PictureRecord& picture, const ReadRequest& request);
// Also UnsuitableImage (13) for sizes over 65535, ErrorCreatingFile (10), ErrorWritingFile (11),
// TooManyColors (12) for pictures deeper than 1 bit.
Status MspWrite(PictureRecord& picture, const WriteOptions& options);

}  // namespace fotomill
