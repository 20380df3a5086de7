#pragma once

#include "picture/picture_record.h"
#include "picture/read_request.h"
#include "picture/write_options.h"

namespace fotomill {

// Silicon Graphics images. Statuses: FileOpenError (1), DamagedFile (2), FileReadError (3) if
// truncated, MemoryAllocationError (6), UnsupportedFormat (8) for the obsolete color maps, NoImages
// (20) for a file that is a color map.
Status SgiInfo(PictureRecord& picture, const ReadRequest& request);
Status SgiRead(PictureRecord& picture, const ReadRequest& request);
// Also UnsuitableImage (13) for more than 4 GiB of data, ErrorCreatingFile (10), ErrorWritingFile
// (11).
Status SgiWrite(PictureRecord& picture, const WriteOptions& options);

}  // namespace fotomill
