#pragma once

#include <span>

#include "core/byte_writer.h"
#include "picture/picture_record.h"
#include "picture/read_request.h"
#include "picture/sequence.h"
#include "picture/write_options.h"

namespace fotomill {

// Windows icons and cursors. `page` of the request is an index of entries, best first. Statuses:
// FileOpenError (1), DamagedFile (2), FileReadError (3) if an entry is truncated,
// MemoryAllocationError (6), UnsupportedFormat (8) for a compressed bitmap, NoImages (20) for an
// empty file.
Status IcoInfo(PictureRecord& picture, const ReadRequest& request);
Status IcoRead(PictureRecord& picture, const ReadRequest& request);
// Writes one entry; a cursor if the extension is "cur". Also ErrorCreatingFile (10),
// ErrorWritingFile (11).
Status IcoWrite(PictureRecord& picture, const WriteOptions& options);
// Writes a file with several pictures.
Status IcoSequenceBegin(const std::string& path, const SequenceFacts& facts,
                        const WriteOptions& options, SequencePointer& sequence);

// For an icon file embedded in another file: facts, pixels, and
// writing a picture of at most 256 x 256 pixels as a cursor with one
// bitmap and mask. `picture` keeps the name and size of its file.
Status DescribeIcon(std::span<const uint8_t> file, const ReadRequest& request,
                    PictureRecord& picture);
Status DecodeIcon(std::span<const uint8_t> file, const ReadRequest& request,
                  PictureRecord& picture);
Status EncodeCursor(const PictureRecord& picture, ByteWriter& out);

}  // namespace fotomill
