#pragma once

#include "picture/picture_record.h"
#include "picture/read_request.h"

namespace fotomill {

// Pictures of Casio's QV cameras. Statuses: FileOpenError (1), those of JpegRead, and NoImages (20)
// for a file without a picture.
Status CamInfo(PictureRecord& picture, const ReadRequest& request);
Status CamRead(PictureRecord& picture, const ReadRequest& request);
Status CamDetails(PictureRecord& picture);

}  // namespace fotomill
