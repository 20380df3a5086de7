#pragma once

#include "picture/picture_record.h"
#include "picture/read_request.h"
#include "picture/write_options.h"

namespace fotomill {

// JPEG. Statuses: FileOpenError (1), DamagedFile (2), FileReadError (3) when pixel data are cut
// short, MemoryAllocationError (6), UnsupportedFormat (8) for the processes that are not decoded
// (arithmetic, lossless, 12 bits). `thumbnailSide` of the request asks for a smaller decode.
Status JpegInfo(PictureRecord& picture, const ReadRequest& request);
Status JpegRead(PictureRecord& picture, const ReadRequest& request);
// Also ErrorCreatingFile (10), ErrorWritingFile (11).
Status JpegWrite(PictureRecord& picture, const WriteOptions& options);
Status JpegDetails(PictureRecord& picture);

}  // namespace fotomill
