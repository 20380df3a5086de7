#pragma once

#include "picture/picture_record.h"
#include "picture/read_request.h"
#include "picture/write_options.h"

namespace fotomill {

// Pictures as text that mail programs could send. The file inside is read by the row of its name,
// or where that refuses it by that of its contents; of the name nothing but the extension counts.
// Statuses: those of that row; DamagedFile (2), FileReadError (3) and MemoryAllocationError (6) of
// the text; UnsupportedFormat (8) for files that no row reads, for archives, and for text within
// text.
Status UueInfo(PictureRecord& picture, const ReadRequest& request);
Status UueRead(PictureRecord& picture, const ReadRequest& request);
// Wraps a GIF up to 8 bits, else a JPEG. Statuses of their rows.
Status UueWrite(PictureRecord& picture, const WriteOptions& options);

}  // namespace fotomill
