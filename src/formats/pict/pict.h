#pragma once

#include "picture/picture_record.h"
#include "picture/read_request.h"
#include "picture/write_options.h"

namespace fotomill {

// Macintosh pictures (PICT). Statuses: FileOpenError (1), DamagedFile (2), FileReadError (3) if
// truncated, MemoryAllocationError (6), UnsupportedFormat (8) for unsupported pixel formats,
// NoImages (20) for a drawing without bitmaps.
Status PictInfo(PictureRecord& picture, const ReadRequest& request);
Status PictRead(PictureRecord& picture, const ReadRequest& request);
// Also ErrorCreatingFile (10), ErrorWritingFile (11).
Status PictWrite(PictureRecord& picture, const WriteOptions& options);
Status PictDetails(PictureRecord& picture);

}  // namespace fotomill
