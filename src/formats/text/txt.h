#pragma once

#include "picture/picture_record.h"
#include "picture/read_request.h"
#include "picture/write_options.h"

namespace fotomill {

// Text files, drawn as a picture in black and white. Statuses: FileOpenError (1), DamagedFile (2)
// for what is no text, MemoryAllocationError (6), NoImages (20) for an empty file.
Status TxtInfo(PictureRecord& picture, const ReadRequest& request);
Status TxtRead(PictureRecord& picture, const ReadRequest& request);
// A picture made of characters. Also ErrorCreatingFile (10), ErrorWritingFile (11).
Status TxtWrite(PictureRecord& picture, const WriteOptions& options);

}  // namespace fotomill
