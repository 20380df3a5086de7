#pragma once

#include "picture/picture_record.h"
#include "picture/read_request.h"

namespace fotomill {

// FlashPix pictures. Statuses: FileOpenError (1), DamagedFile (2), FileReadError (3) when data are
// cut short, MemoryAllocationError (6), UnsupportedFormat (8) for colors and tiles that are not
// decoded.
Status FpxInfo(PictureRecord& picture, const ReadRequest& request);
Status FpxRead(PictureRecord& picture, const ReadRequest& request);
Status FpxDetails(PictureRecord& picture);

}  // namespace fotomill
