#pragma once

#include "picture/picture_record.h"
#include "picture/read_request.h"
#include "picture/write_options.h"

namespace fotomill {

// Dr. Halo pictures, with the palette in a second file of the same name. Statuses: FileOpenError
// (1), DamagedFile (2), FileReadError (3) if truncated, MemoryAllocationError (6). If the palette
// is missing or damaged, the picture is gray; a damaged one sets `warning`.
Status CutInfo(PictureRecord& picture, const ReadRequest& request);
Status CutRead(PictureRecord& picture, const ReadRequest& request);
// Writes both files or none. Also TooManyColors (12) above 8 bits, UnsuitableImage (13) if rows do
// not fit their size fields, ErrorCreatingFile (10) also if the palette's name is taken by another
// file, ErrorWritingFile (11).
Status CutWrite(PictureRecord& picture, const WriteOptions& options);

}  // namespace fotomill
