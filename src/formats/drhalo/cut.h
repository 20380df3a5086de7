#pragma once

#include "picture/picture_record.h"
#include "picture/read_request.h"
#include "picture/write_options.h"

namespace fotomill {

// Dr. Halo pictures, whose palette is a second file of the same name. Statuses: FileOpenError (1),
// DamagedFile (2), FileReadError (3) when data are cut short, MemoryAllocationError (6). A palette
// that is missing or damaged leaves the picture gray; a damaged one is mentioned in `warning`.
Status CutInfo(PictureRecord& picture, const ReadRequest& request);
Status CutRead(PictureRecord& picture, const ReadRequest& request);
// Writes both files or none. Also TooManyColors (12) above 8 bits, UnsuitableImage (13) for rows
// that do not fit their fields, ErrorCreatingFile (10) also when the palette's name belongs to
// another file, ErrorWritingFile (11).
Status CutWrite(PictureRecord& picture, const WriteOptions& options);

}  // namespace fotomill
