#pragma once

#include "picture/picture_record.h"
#include "picture/read_request.h"
#include "picture/write_options.h"

namespace fotomill {

// OS/2 bitmap arrays; also single bitmaps, icons and pointers of OS/2. `page` of the request counts
// the entries in the order of the file. Statuses: FileOpenError (1), DamagedFile (2), FileReadError
// (3) when data are cut short, MemoryAllocationError (6), UnsupportedFormat (8) for depths and
// compressions that are not read, NoImages (20) for a page that is not there.
Status BgaInfo(PictureRecord& picture, const ReadRequest& request);
Status BgaRead(PictureRecord& picture, const ReadRequest& request);
// Writes an array of one bitmap. Also ErrorCreatingFile (10), ErrorWritingFile (11).
Status BgaWrite(PictureRecord& picture, const WriteOptions& options);

}  // namespace fotomill
