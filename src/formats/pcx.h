#pragma once

#include "picture/picture_record.h"
#include "picture/write_options.h"

namespace fotomill {

Status PcxInfo(PictureRecord& picture, const char* fileName, uint32_t flags);
Status PcxRead(PictureRecord& picture, const char* fileName);
Status PcxWrite(PictureRecord& picture, const WriteOptions& options);

}  // namespace fotomill
