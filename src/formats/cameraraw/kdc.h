#pragma once

#include "picture/picture_record.h"
#include "picture/read_request.h"

namespace fotomill {

// Raw files of cameras that are built of TIFF's directories, such as Kodak's KDC. They are
// developed by LibRaw where it is installed and knows the camera; else the preview that the camera
// put beside the data is the picture. Statuses: FileOpenError (1), DamagedFile (2),
// MemoryAllocationError (6), UnsupportedFormat (8) for an unknown camera and FeatureDisabled (22)
// without LibRaw, both for files without a preview.
Status KdcInfo(PictureRecord& picture, const ReadRequest& request);
Status KdcRead(PictureRecord& picture, const ReadRequest& request);

}  // namespace fotomill
