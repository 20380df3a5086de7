#pragma once

#include "picture/picture_record.h"
#include "picture/read_request.h"
#include "picture/write_options.h"

namespace fotomill {

Status MacInfo(PictureRecord& picture, const ReadRequest& request);
Status MacRead(PictureRecord& picture, const ReadRequest& request);
Status MacWrite(PictureRecord& picture, const WriteOptions& options);

}  // namespace fotomill
