#pragma once

#include "picture/picture_record.h"
#include "picture/read_request.h"
#include "picture/write_options.h"

namespace fotomill {

// HD Photo. Statuses: FileOpenError (1), DamagedFile (2), FileReadError (3), MemoryAllocationError
// (6), UnsupportedFormat (8) for unsupported color formats, NoImages (20) if the page does not
// exist. Reading and writing also FeatureDisabled (22) without the library.
Status HdpInfo(PictureRecord& picture, const ReadRequest& request);
Status HdpRead(PictureRecord& picture, const ReadRequest& request);
Status HdpDetails(PictureRecord& picture);
// Also ErrorCreatingFile (10), ErrorWritingFile (11).
Status HdpWrite(PictureRecord& picture, const WriteOptions& options);

// Whether pixels can be read and written on this machine.
bool HdpWorksHere();

}  // namespace fotomill
