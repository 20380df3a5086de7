#pragma once

#include "picture/picture_record.h"
#include "picture/read_request.h"
#include "picture/write_options.h"

namespace fotomill {

// Photoshop documents. Statuses: FileOpenError (1), DamagedFile (2), FileReadError (3) if
// truncated, MemoryAllocationError (6), UnsupportedFormat (8) for large documents (PSB), 32 bits
// per sample and unknown compressions, NoImages (20) for a document with neither a merged picture
// nor layers.
Status PsdInfo(PictureRecord& picture, const ReadRequest& request);
Status PsdRead(PictureRecord& picture, const ReadRequest& request);
// Also ErrorCreatingFile (10), ErrorWritingFile (11).
Status PsdWrite(PictureRecord& picture, const WriteOptions& options);
Status PsdDetails(PictureRecord& picture);

}  // namespace fotomill
