#pragma once

#include "picture/picture_record.h"
#include "picture/write_options.h"

namespace fotomill {

Status MacInfo(PictureRecord& picture, const char* fileName, uint32_t flags);
Status MacRead(PictureRecord& picture, const char* fileName);
Status MacWrite(PictureRecord& picture, const WriteOptions& options);

}  // namespace fotomill
