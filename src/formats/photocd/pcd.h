#pragma once

#include "picture/picture_record.h"
#include "picture/read_request.h"

namespace fotomill {

// Photo CD pictures. Uses the largest resolution allowed by the request's options. Statuses:
// FileOpenError (1), DamagedFile (2), FileReadError (3) if truncated, MemoryAllocationError (6),
// NoImages (20) if an overview does not have the picture.
Status PcdInfo(PictureRecord& picture, const ReadRequest& request);
Status PcdRead(PictureRecord& picture, const ReadRequest& request);
Status PcdDetails(PictureRecord& picture);

}  // namespace fotomill
