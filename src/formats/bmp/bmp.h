#pragma once

#include "picture/picture_record.h"
#include "picture/read_request.h"
#include "picture/write_options.h"

namespace fotomill {

// The BMP family: Windows and OS/2 bitmaps. The file layout, and what is peculiar to this
// codec, is described in bmp.cpp.

// Fills the facts of `picture`: size, depth, palette, type name, kHasAlpha for files deeper than 24
// bits. Ok, FileOpenError; DamagedFile for a short header, another signature, or a size or depth
// that leaves nothing to decode.
Status BmpInfo(PictureRecord& picture, const ReadRequest& request);

// Fills the facts and decodes the pixels into `image`, and with `UseAlphaChannels` the fourth
// channel into `alpha`. Ok, FileOpenError, DamagedFile as BmpInfo; FileReadError when the file ends
// too early; MemoryAllocationError.
Status BmpRead(PictureRecord& picture, const ReadRequest& request);

// Writes `image`, and `alpha` as the fourth channel, to picture.fileName, uncompressed, in the
// dialect that `WriteOS2Bitmaps` says. Ok; MemoryAllocationError when there is no image;
// UnsuitableImage when a size does not fit the header's fields; ErrorCreatingFile,
// ErrorWritingFile.
Status BmpWrite(PictureRecord& picture, const WriteOptions& options);

// Fills `detailLines` with the header of picture.fileName, and sets `fileSize` and a black and
// white palette as BmpInfo begins with. Ok, FileOpenError, DamagedFile for a short header or
// another signature.
Status BmpDetails(PictureRecord& picture);

}  // namespace fotomill
