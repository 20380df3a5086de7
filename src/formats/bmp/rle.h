#pragma once

#include "picture/picture_record.h"
#include "picture/write_options.h"

namespace fotomill {

// Writes a 256-color Windows bitmap with run-length encoding (RLE8), to be read by BmpInfo and
// BmpRead. Ok; MemoryAllocationError, TooManyColors (12) above 8 bits, ErrorCreatingFile,
// ErrorWritingFile, FunctionCancelled.
Status RleWrite(PictureRecord& picture, const WriteOptions& options);

}  // namespace fotomill
