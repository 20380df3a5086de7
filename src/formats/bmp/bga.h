#pragma once

#include "picture/picture_record.h"
#include "picture/read_request.h"
#include "picture/write_options.h"

namespace fotomill {

// OS/2 bitmap arrays; also single bitmaps, icons and pointers of OS/2. `page` of the request is an
// index of entries in file order. Statuses: FileOpenError (1), DamagedFile (2), FileReadError (3)
// if truncated, MemoryAllocationError (6), UnsupportedFormat (8) for unsupported depths and
// compressions, NoImages (20) if the page does not exist.
Status BgaInfo(PictureRecord& picture, const ReadRequest& request);
Status BgaRead(PictureRecord& picture, const ReadRequest& request);
// Writes an array of one bitmap. Also ErrorCreatingFile (10), ErrorWritingFile (11).
Status BgaWrite(PictureRecord& picture, const WriteOptions& options);

}  // namespace fotomill
