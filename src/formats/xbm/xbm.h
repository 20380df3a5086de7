#pragma once

#include "picture/picture_record.h"
#include "picture/write_options.h"

namespace fotomill {

Status XbmInfo(PictureRecord& picture, const char* fileName, uint32_t flags);
Status XbmRead(PictureRecord& picture, const char* fileName);
Status XbmWrite(PictureRecord& picture, const WriteOptions& options);

}  // namespace fotomill
