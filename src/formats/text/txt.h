#pragma once

#include "picture/picture_record.h"
#include "picture/read_request.h"
#include "picture/write_options.h"

namespace fotomill {

// Text files, drawn as a black and white picture. Statuses: FileOpenError (1), DamagedFile (2) if
// it is not text, MemoryAllocationError (6), NoImages (20) for an empty file.
Status TxtInfo(PictureRecord& picture, const ReadRequest& request);
Status TxtRead(PictureRecord& picture, const ReadRequest& request);
// Writes a picture as characters. Also ErrorCreatingFile (10), ErrorWritingFile (11).
Status TxtWrite(PictureRecord& picture, const WriteOptions& options);

}  // namespace fotomill
