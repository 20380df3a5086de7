#pragma once

#include "picture/picture_record.h"
#include "picture/read_request.h"

namespace fotomill {

// Pictures in ZIP and RAR archives. The pages are the entries whose names say that they are
// pictures of a built-in format, in natural order; hidden ones, texts, and archives in the archive
// are left out. Statuses: FileOpenError (1); DamagedFile (2), FileReadError (3),
// MemoryAllocationError (6), UnsupportedFormat (8) for split archives and unknown compressions,
// NoImages (20) if there is no such page, FeatureDisabled (22) without libarchive, InvalidPassword
// (25) for encrypted pictures; else those of the picture's row.
Status ArchivePictureInfo(PictureRecord& picture, const ReadRequest& request);
Status ArchivePictureRead(PictureRecord& picture, const ReadRequest& request);

}  // namespace fotomill
