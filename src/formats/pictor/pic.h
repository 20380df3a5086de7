#pragma once

#include "picture/picture_record.h"
#include "picture/read_request.h"

namespace fotomill {

// PIC files, which may be Pictor or Pegasus pictures, and KQP files, which are the latter.
// Statuses: FileOpenError (1), and those of PictorRead and JpegRead.
Status PicInfo(PictureRecord& picture, const ReadRequest& request);
Status PicRead(PictureRecord& picture, const ReadRequest& request);
Status PicDetails(PictureRecord& picture);

}  // namespace fotomill
