#pragma once

#include <span>

#include "core/byte_writer.h"
#include "picture/picture_record.h"
#include "picture/read_request.h"
#include "picture/sequence.h"
#include "picture/write_options.h"

namespace fotomill {

// Windows icons and cursors. `page` of the request counts the entries from the best one, 0, down.
// Statuses: FileOpenError (1), DamagedFile (2), FileReadError (3) when an entry is cut short,
// MemoryAllocationError (6), UnsupportedFormat (8) for a compressed bitmap, NoImages (20) for an
// empty file.
Status IcoInfo(PictureRecord& picture, const ReadRequest& request);
Status IcoRead(PictureRecord& picture, const ReadRequest& request);
// Writes one entry; a cursor when the extension is "cur". Also ErrorCreatingFile (10),
// ErrorWritingFile (11).
Status IcoWrite(PictureRecord& picture, const WriteOptions& options);
// A file of several pictures.
Status IcoSequenceBegin(const std::string& path, const SequenceFacts& facts,
                        const WriteOptions& options, SequencePointer& sequence);

// The same for a file inside another one: facts, pixels, and a cursor of one bitmap
// with its mask, which a picture of at most 256 x 256 pixels becomes. `picture` keeps its file's
// name and size.
Status DescribeIcon(std::span<const uint8_t> file, const ReadRequest& request,
                    PictureRecord& picture);
Status DecodeIcon(std::span<const uint8_t> file, const ReadRequest& request,
                  PictureRecord& picture);
Status EncodeCursor(const PictureRecord& picture, ByteWriter& out);

}  // namespace fotomill
