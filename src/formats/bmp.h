#pragma once

#include "picture/picture_record.h"
#include "picture/write_options.h"

namespace fotomill {

Status BmpInfo(PictureRecord& picture, const char* fileName, uint32_t flags);
Status BmpRead(PictureRecord& picture, const char* fileName);
Status BmpWrite(PictureRecord& picture, const WriteOptions& options);
Status BmpDetails(PictureRecord& picture);

}  // namespace fotomill
