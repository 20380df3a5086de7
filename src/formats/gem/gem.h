#pragma once

#include "picture/picture_record.h"
#include "picture/read_request.h"
#include "picture/write_options.h"

namespace fotomill {

// GEM rasters. Statuses: FileOpenError (1), DamagedFile (2),
// FileReadError (3) if truncated, MemoryAllocationError (6),
// UnsupportedFormat (8) for unsupported plane counts and color models.
Status GemInfo(PictureRecord& picture, const ReadRequest& request);
Status GemRead(PictureRecord& picture, const ReadRequest& request);
// Also ErrorCreatingFile (10), ErrorWritingFile (11).
Status GemWrite(PictureRecord& picture, const WriteOptions& options);

}  // namespace fotomill
