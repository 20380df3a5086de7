#pragma once

#include "picture/picture_record.h"
#include "picture/read_request.h"
#include "picture/write_options.h"

namespace fotomill {

// The BMP family: Windows and OS/2 bitmaps. For the file layout and this codec's
// quirks see bmp.cpp.

// Sets size, depth, palette and type name, and kHasAlpha for files deeper than 24 bits. Ok,
// FileOpenError; DamagedFile for a truncated header, a wrong signature, or a size or depth that
// cannot be decoded.
Status BmpInfo(PictureRecord& picture, const ReadRequest& request);

// Calls BmpInfo and decodes the pixels into `image`, and with
// `UseAlphaChannels` the fourth channel into `alpha`. Statuses of
// BmpInfo, and FileReadError if truncated, MemoryAllocationError.
Status BmpRead(PictureRecord& picture, const ReadRequest& request);

// Writes `image`, and `alpha` as the fourth channel, to picture.fileName,
// uncompressed, in the dialect selected by `WriteOS2Bitmaps`. Ok;
// MemoryAllocationError if there is no image; UnsuitableImage if a size
// does not fit the header's fields; ErrorCreatingFile, ErrorWritingFile.
Status BmpWrite(PictureRecord& picture, const WriteOptions& options);

// Fills `detailLines` from the header of picture.fileName, and sets `fileSize` and a black
// and white palette like BmpInfo. Ok, FileOpenError, DamagedFile for a truncated header or
// a wrong signature.
Status BmpDetails(PictureRecord& picture);

}  // namespace fotomill
