#pragma once

#include "picture/picture_record.h"
#include "picture/read_request.h"
#include "picture/write_options.h"

namespace fotomill {

// Truevision Targa. Statuses: FileOpenError (1), DamagedFile (2),
// FileReadError (3) if truncated, MemoryAllocationError (6),
// UnsupportedFormat (8) for unsupported types, NoImages (20) for type 0.
Status TgaInfo(PictureRecord& picture, const ReadRequest& request);
Status TgaRead(PictureRecord& picture, const ReadRequest& request);
// Also ErrorCreatingFile (10), ErrorWritingFile (11).
Status TgaWrite(PictureRecord& picture, const WriteOptions& options);

}  // namespace fotomill
