#pragma once

#include "picture/picture_record.h"
#include "picture/read_request.h"
#include "picture/write_options.h"

namespace fotomill {

// The bitmap of a WordPerfect graphics file, the largest if there are several. Statuses:
// FileOpenError (1), DamagedFile (2), FileReadError (3) if truncated, MemoryAllocationError (6),
// UnsupportedFormat (8) for unsupported depths, NoImages (20) for drawings without a bitmap,
// InvalidPassword (25) for encrypted files.
Status WpgInfo(PictureRecord& picture, const ReadRequest& request);
Status WpgRead(PictureRecord& picture, const ReadRequest& request);
// Also TooManyColors (12) above 8 bits, UnsuitableImage (13) for more than 2 GiB of data,
// ErrorCreatingFile (10), ErrorWritingFile (11).
Status WpgWrite(PictureRecord& picture, const WriteOptions& options);

}  // namespace fotomill
