#pragma once

#include <cstdint>
#include <span>

#include "picture/picture_record.h"
#include "picture/read_request.h"
#include "picture/write_options.h"
#include "platform/file_view.h"

namespace fotomill {

// JPEG. Statuses: FileOpenError (1), DamagedFile (2), FileReadError (3) when pixel data are cut
// short, MemoryAllocationError (6), UnsupportedFormat (8) for the processes that are not decoded
// (arithmetic, lossless, 12 bits). `thumbnailSide` of the request asks for a smaller decode.
Status JpegInfo(PictureRecord& picture, const ReadRequest& request);
Status JpegRead(PictureRecord& picture, const ReadRequest& request);
// Also ErrorCreatingFile (10), ErrorWritingFile (11).
Status JpegWrite(PictureRecord& picture, const WriteOptions& options);
Status JpegDetails(PictureRecord& picture);

// A JPEG stream inside a file of another format.
struct JpegStream {
  std::span<const uint8_t> data = {};
  std::span<const uint8_t> tables = {};  // as ReadJpegHeader takes them
};
// As JpegInfo, JpegRead and JpegDetails. The first leaves the file's size alone; the last adds
// lines to those that are there. `file` is where the stream comes from, still open. Statuses as
// above but for FileOpenError.
Status JpegStreamInfo(PictureRecord& picture, const JpegStream& stream);
Status JpegStreamRead(PictureRecord& picture, const ReadRequest& request, const JpegStream& stream,
                      const platform::FileView& file);
Status JpegStreamDetails(PictureRecord& picture, const JpegStream& stream);

}  // namespace fotomill
