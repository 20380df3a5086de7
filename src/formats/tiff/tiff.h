#pragma once

#include "picture/picture_record.h"
#include "picture/read_request.h"
#include "picture/sequence.h"
#include "picture/write_options.h"

namespace fotomill {

// TIFF and BigTIFF. Statuses: FileOpenError (1), DamagedFile (2), FileReadError (3) if truncated,
// MemoryAllocationError (6), UnsupportedFormat (8) for unsupported samples or compressions,
// NoImages (20) if the page does not exist. Reads the request's page.
// request's page.
Status TiffInfo(PictureRecord& picture, const ReadRequest& request);
Status TiffRead(PictureRecord& picture, const ReadRequest& request);
// Also ErrorCreatingFile (10), ErrorWritingFile (11).
Status TiffWrite(PictureRecord& picture, const WriteOptions& options);
// Writes a file with several pages.
Status TiffSequenceBegin(const std::string& path, const SequenceFacts& facts,
                         const WriteOptions& options, SequencePointer& sequence);
Status TiffDetails(PictureRecord& picture);

}  // namespace fotomill
