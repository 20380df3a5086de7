#pragma once

#include "picture/picture_record.h"
#include "picture/read_request.h"
#include "picture/write_options.h"

namespace fotomill {

// Paint Shop Pro images (PSP). Statuses: FileOpenError (1), DamagedFile (2), FileReadError (3) if
// truncated, MemoryAllocationError (6), UnsupportedFormat (8) for unsupported compressions,
// NoImages (20) for a file without raster data.
Status PspInfo(PictureRecord& picture, const ReadRequest& request);
Status PspRead(PictureRecord& picture, const ReadRequest& request);
// Also UnsuitableImage (13) for data of more than 4 GB, ErrorCreatingFile (10), ErrorWritingFile
// (11).
Status PspWrite(PictureRecord& picture, const WriteOptions& options);
Status PspDetails(PictureRecord& picture);

}  // namespace fotomill
