#pragma once

#include "picture/animation.h"
#include "picture/picture_record.h"
#include "picture/read_request.h"
#include "picture/sequence.h"
#include "picture/write_options.h"

namespace fotomill {

// WebP. Statuses: FileOpenError (1), DamagedFile (2), FileReadError (3) if truncated,
// MemoryAllocationError (6), UnsupportedFormat (8), NoImages (20) for a frame that does not exist.
// Frames of an animation are pages.
Status WebpInfo(PictureRecord& picture, const ReadRequest& request);
Status WebpRead(PictureRecord& picture, const ReadRequest& request);
Status WebpAnimate(const ReadRequest& request, AnimationPointer& animation);
// Also ErrorCreatingFile (10), ErrorWritingFile (11).
Status WebpWrite(PictureRecord& picture, const WriteOptions& options);
// Writes an animation.
Status WebpSequenceBegin(const std::string& path, const SequenceFacts& facts,
                         const WriteOptions& options, SequencePointer& sequence);

}  // namespace fotomill
