#pragma once

#include "picture/picture_record.h"
#include "picture/read_request.h"
#include "picture/write_options.h"

namespace fotomill {

Status FitsInfo(PictureRecord& picture, const ReadRequest& request);
Status FitsRead(PictureRecord& picture, const ReadRequest& request);
Status FitsWrite(PictureRecord& picture, const WriteOptions& options);
Status FitsDetails(PictureRecord& picture);

}  // namespace fotomill
