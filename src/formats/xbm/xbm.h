#pragma once

#include "picture/picture_record.h"
#include "picture/read_request.h"
#include "picture/write_options.h"

namespace fotomill {

Status XbmInfo(PictureRecord& picture, const ReadRequest& request);
Status XbmRead(PictureRecord& picture, const ReadRequest& request);
Status XbmWrite(PictureRecord& picture, const WriteOptions& options);

}  // namespace fotomill
