#pragma once

#include "picture/animation.h"
#include "picture/picture_record.h"
#include "picture/read_request.h"
#include "picture/sequence.h"
#include "picture/write_options.h"

namespace fotomill {

// CompuServe GIF, 87a and 89a. Statuses: FileOpenError (1), DamagedFile (2), FileReadError (3) when
// data are cut short, MemoryAllocationError (6), NoImages (20) for a file without a picture. `page`
// of the request selects a frame, which is shown on what the frames before it left on the screen.
Status GifInfo(PictureRecord& picture, const ReadRequest& request);
Status GifRead(PictureRecord& picture, const ReadRequest& request);
// Also TooManyColors (12) for 24-bit pictures, ErrorCreatingFile (10), ErrorWritingFile (11).
Status GifWrite(PictureRecord& picture, const WriteOptions& options);
Status GifDetails(PictureRecord& picture);
Status GifAnimate(const ReadRequest& request, AnimationPointer& animation);
// A file with several frames. TooManyColors (12) for a frame of more than 256, the transparent one
// included; it can be added again with fewer.
Status GifSequenceBegin(const std::string& path, const SequenceFacts& facts,
                        const WriteOptions& options, SequencePointer& sequence);

}  // namespace fotomill
