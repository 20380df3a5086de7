#pragma once

#include "picture/picture_record.h"
#include "picture/write_options.h"

namespace fotomill {

Status FitsInfo(PictureRecord& picture, const char* fileName, uint32_t flags);
Status FitsRead(PictureRecord& picture, const char* fileName);
Status FitsWrite(PictureRecord& picture, const WriteOptions& options);
Status FitsDetails(PictureRecord& picture);

}  // namespace fotomill
