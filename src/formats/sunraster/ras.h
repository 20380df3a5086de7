#pragma once

#include "picture/picture_record.h"
#include "picture/read_request.h"
#include "picture/write_options.h"

namespace fotomill {

// Sun rasters. Statuses: FileOpenError (1), DamagedFile (2), FileReadError (3) if truncated,
// MemoryAllocationError (6), UnsupportedFormat (8) for unsupported types and depths.
Status RasInfo(PictureRecord& picture, const ReadRequest& request);
Status RasRead(PictureRecord& picture, const ReadRequest& request);
// Also UnsuitableImage (13) for more than 4 GiB of pixels, ErrorCreatingFile (10), ErrorWritingFile
// (11).
Status RasWrite(PictureRecord& picture, const WriteOptions& options);

}  // namespace fotomill
