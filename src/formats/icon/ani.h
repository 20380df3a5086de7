#pragma once

#include "picture/animation.h"
#include "picture/picture_record.h"
#include "picture/read_request.h"
#include "picture/write_options.h"

namespace fotomill {

// Windows animated cursors. The pages are the steps of the animation. Statuses: FileOpenError (1),
// DamagedFile (2) for other files, NoImages (20) if there is no picture or no such step, and those
// of the embedded icons.
Status AniInfo(PictureRecord& picture, const ReadRequest& request);
Status AniRead(PictureRecord& picture, const ReadRequest& request);
// Places each step on a canvas of the first one's size.
Status AniAnimate(const ReadRequest& request, AnimationPointer& animation);
// Writes a static cursor. ErrorCreatingFile (10), ErrorWritingFile (11).
Status AniWrite(PictureRecord& picture, const WriteOptions& options);

}  // namespace fotomill
