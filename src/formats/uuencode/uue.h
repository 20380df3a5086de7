#pragma once

#include "picture/picture_record.h"
#include "picture/read_request.h"
#include "picture/write_options.h"

namespace fotomill {

// Pictures encoded as text for e-mail. The embedded file is read by the row of
// its name or, if that fails, by the row of its contents; of the name only the
// extension is used. Statuses: those of that row; DamagedFile (2), FileReadError
// (3) and MemoryAllocationError (6) for the text; UnsupportedFormat (8) for
// files no row can read, for archives, and for nested text.
Status UueInfo(PictureRecord& picture, const ReadRequest& request);
Status UueRead(PictureRecord& picture, const ReadRequest& request);
// Embeds a GIF up to 8 bits, else a JPEG. Statuses of their rows.
Status UueWrite(PictureRecord& picture, const WriteOptions& options);

}  // namespace fotomill
