#pragma once

#include "picture/animation.h"
#include "picture/picture_record.h"
#include "picture/read_request.h"
#include "picture/sequence.h"
#include "picture/write_options.h"

namespace fotomill {

// CompuServe GIF, 87a and 89a. Statuses: FileOpenError (1), DamagedFile (2), FileReadError (3) if
// truncated, MemoryAllocationError (6), NoImages (20) for a file without a picture. `page` of the
// request selects a frame, which is composed with the preceding ones.
Status GifInfo(PictureRecord& picture, const ReadRequest& request);
Status GifRead(PictureRecord& picture, const ReadRequest& request);
// Also TooManyColors (12) for 24-bit pictures, ErrorCreatingFile (10), ErrorWritingFile (11).
Status GifWrite(PictureRecord& picture, const WriteOptions& options);
Status GifDetails(PictureRecord& picture);
Status GifAnimate(const ReadRequest& request, AnimationPointer& animation);
// Writes a file with several frames. TooManyColors (12) for a frame with more than 256, including
// transparency; it can be added again with fewer.
Status GifSequenceBegin(const std::string& path, const SequenceFacts& facts,
                        const WriteOptions& options, SequencePointer& sequence);

}  // namespace fotomill
