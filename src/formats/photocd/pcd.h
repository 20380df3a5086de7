#pragma once

#include "picture/picture_record.h"
#include "picture/read_request.h"

namespace fotomill {

// Photo CD pictures. The size is the largest of the file that the request's options allow.
// Statuses: FileOpenError (1), DamagedFile (2), FileReadError (3) when data are cut short,
// MemoryAllocationError (6), NoImages (20) for an overview without that picture.
Status PcdInfo(PictureRecord& picture, const ReadRequest& request);
Status PcdRead(PictureRecord& picture, const ReadRequest& request);
Status PcdDetails(PictureRecord& picture);

}  // namespace fotomill
