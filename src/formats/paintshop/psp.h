#pragma once

#include "picture/picture_record.h"
#include "picture/read_request.h"
#include "picture/write_options.h"

namespace fotomill {

// Paint Shop Pro images (PSP). Statuses: FileOpenError (1), DamagedFile (2), FileReadError (3) when
// data are cut short, MemoryAllocationError (6), UnsupportedFormat (8) for compressions that are
// not decoded, NoImages (20) for a file without any raster.
Status PspInfo(PictureRecord& picture, const ReadRequest& request);
Status PspRead(PictureRecord& picture, const ReadRequest& request);
// Also UnsuitableImage (13) for data of more than 4 GB, ErrorCreatingFile (10), ErrorWritingFile
// (11).
Status PspWrite(PictureRecord& picture, const WriteOptions& options);
Status PspDetails(PictureRecord& picture);

}  // namespace fotomill
