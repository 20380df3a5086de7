#pragma once

#include "picture/picture_record.h"
#include "picture/read_request.h"

namespace fotomill {

// Pictures in ZIP and RAR archives. The pages are the entries with names of built-in picture
// formats, in natural order, except hidden ones, texts, and nested archives. Statuses:
// FileOpenError (1); DamagedFile (2), FileReadError (3), MemoryAllocationError (6),
// UnsupportedFormat (8) for split archives and unknown compressions, NoImages (20) if there is no
// such page, FeatureDisabled (22) without libarchive, InvalidPassword (25) for encrypted pictures;
// else those of the picture's format.
Status ArchivePictureInfo(PictureRecord& picture, const ReadRequest& request);
Status ArchivePictureRead(PictureRecord& picture, const ReadRequest& request);

}  // namespace fotomill
