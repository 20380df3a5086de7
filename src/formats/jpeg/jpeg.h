#pragma once

#include <cstdint>
#include <span>

#include "picture/picture_record.h"
#include "picture/read_request.h"
#include "picture/write_options.h"
#include "platform/file_view.h"

namespace fotomill {

// JPEG. Statuses: FileOpenError (1), DamagedFile (2), FileReadError (3) if pixel data are
// truncated, MemoryAllocationError (6), UnsupportedFormat (8) for unsupported processes
// (arithmetic, lossless, 12 bits). `thumbnailSide` of the request selects a reduced-size decode.
Status JpegInfo(PictureRecord& picture, const ReadRequest& request);
Status JpegRead(PictureRecord& picture, const ReadRequest& request);
// Also ErrorCreatingFile (10), ErrorWritingFile (11).
Status JpegWrite(PictureRecord& picture, const WriteOptions& options);
Status JpegDetails(PictureRecord& picture);

// A JPEG stream embedded in a file of another format.
struct JpegStream {
  std::span<const uint8_t> data = {};
  std::span<const uint8_t> tables = {};  // as for ReadJpegHeader
};
// As JpegInfo, JpegRead and JpegDetails. The first does not set the file size; the last
// appends its lines. `file` is the file that contains the stream, still open. Statuses as
// above, except FileOpenError.
Status JpegStreamInfo(PictureRecord& picture, const JpegStream& stream);
Status JpegStreamRead(PictureRecord& picture, const ReadRequest& request, const JpegStream& stream,
                      const platform::FileView& file);
Status JpegStreamDetails(PictureRecord& picture, const JpegStream& stream);

}  // namespace fotomill
