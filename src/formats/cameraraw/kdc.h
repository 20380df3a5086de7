#pragma once

#include "picture/picture_record.h"
#include "picture/read_request.h"

namespace fotomill {

// TIFF-based camera raw files, such as Kodak's KDC. Decoded by LibRaw if it
// is installed and supports the camera; otherwise the embedded preview is
// used. Statuses: FileOpenError (1), DamagedFile (2), MemoryAllocationError
// (6), UnsupportedFormat (8) for an unknown camera and FeatureDisabled (22)
// without LibRaw, both only for files without a preview.
Status KdcInfo(PictureRecord& picture, const ReadRequest& request);
Status KdcRead(PictureRecord& picture, const ReadRequest& request);

}  // namespace fotomill
