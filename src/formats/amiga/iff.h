#pragma once

#include "picture/picture_record.h"
#include "picture/read_request.h"
#include "picture/write_options.h"

namespace fotomill {

// Amiga interchange files with a bitmap (IFF, LBM, HAM). Statuses: FileOpenError (1), DamagedFile
// (2), FileReadError (3) if truncated, MemoryAllocationError (6), UnsupportedFormat (8) for other
// kinds of bitmaps and compressions, NoImages (20) for a file without pixels.
Status IffInfo(PictureRecord& picture, const ReadRequest& request);
Status IffRead(PictureRecord& picture, const ReadRequest& request);
// Also UnsuitableImage (13) for more than 4 GiB of data,
// ErrorCreatingFile (10), ErrorWritingFile (11). HamWrite writes
// 24-bit pictures as HAM8, and palette pictures as IffWrite does.
Status IffWrite(PictureRecord& picture, const WriteOptions& options);
Status HamWrite(PictureRecord& picture, const WriteOptions& options);
Status IffDetails(PictureRecord& picture);

}  // namespace fotomill
