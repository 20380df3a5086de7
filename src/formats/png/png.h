#pragma once

#include <span>

#include "core/byte_writer.h"
#include "picture/animation.h"
#include "picture/picture_record.h"
#include "picture/read_request.h"
#include "picture/sequence.h"
#include "picture/write_options.h"

namespace fotomill {

// Portable Network Graphics. Statuses: FileOpenError (1), DamagedFile (2), FileReadError (3) if
// truncated, MemoryAllocationError (6).
Status PngInfo(PictureRecord& picture, const ReadRequest& request);
Status PngRead(PictureRecord& picture, const ReadRequest& request);
// Also ErrorCreatingFile (10), ErrorWritingFile (11).
Status PngWrite(PictureRecord& picture, const WriteOptions& options);
// The frames of an animation (APNG).
Status PngAnimate(const ReadRequest& request, AnimationPointer& animation);
Status PngSequenceBegin(const std::string& path, const SequenceFacts& facts,
                        const WriteOptions& options, SequencePointer& sequence);
Status PngDetails(PictureRecord& picture);

// As above, for a file in memory, such as inside a container. Statuses as above.
Status DescribePng(std::span<const uint8_t> file, const ReadOptions& options,
                   PictureRecord& picture);
// Reads header and pixels of a PNG file in memory; `partial` as in a read request.
Status DecodePng(std::span<const uint8_t> file, const ReadOptions& options, PictureRecord& picture,
                 bool partial = false);
// Appends the picture's pixels as a PNG file without metadata to `out`.
Status EncodePng(const PictureRecord& picture, const EncodeOptions& options, ByteWriter& out);

}  // namespace fotomill
