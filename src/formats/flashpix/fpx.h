#pragma once

#include "picture/picture_record.h"
#include "picture/read_request.h"

namespace fotomill {

// FlashPix pictures. Statuses: FileOpenError (1), DamagedFile (2),
// FileReadError (3) if truncated, MemoryAllocationError (6),
// UnsupportedFormat (8) for unsupported color spaces and tile formats.
Status FpxInfo(PictureRecord& picture, const ReadRequest& request);
Status FpxRead(PictureRecord& picture, const ReadRequest& request);
Status FpxDetails(PictureRecord& picture);

}  // namespace fotomill
