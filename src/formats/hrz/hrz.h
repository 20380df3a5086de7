#pragma once

#include "picture/picture_record.h"
#include "picture/read_request.h"
#include "picture/write_options.h"

namespace fotomill {

inline constexpr int32_t kHrzWidth = 256, kHrzHeight = 240;  // pixels, in every file

// Slow-scan television frames, always 256 x 240 pixels. Statuses: FileOpenError (1), DamagedFile
// (2) for a larger file, FileReadError (3) for a truncated one, MemoryAllocationError (6).
Status HrzInfo(PictureRecord& picture, const ReadRequest& request);
Status HrzRead(PictureRecord& picture, const ReadRequest& request);
// Also ErrorCreatingFile (10), ErrorWritingFile (11).
Status HrzWrite(PictureRecord& picture, const WriteOptions& options);

}  // namespace fotomill
