#pragma once

#include "picture/picture_record.h"
#include "picture/write_options.h"

namespace fotomill {

// Writes a Windows bitmap of 256 colors, compressed by runs (RLE8); BmpInfo and BmpRead read it.
// Ok; MemoryAllocationError, TooManyColors (12) above 8 bits, ErrorCreatingFile, ErrorWritingFile,
// FunctionCancelled.
Status RleWrite(PictureRecord& picture, const WriteOptions& options);

}  // namespace fotomill
