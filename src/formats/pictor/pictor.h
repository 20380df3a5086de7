#pragma once

#include <cstdint>
#include <span>

#include "picture/picture_record.h"
#include "picture/write_options.h"

namespace fotomill {

// Pictor pictures, as written by PC Paint and related programs, from the contents of a file.
// Statuses: FileReadError (3) if truncated, MemoryAllocationError (6), UnsupportedFormat (8) for
// text screens and unsupported pixel formats, DamagedFile (2).
bool IsPictor(std::span<const uint8_t> file);
Status PictorInfo(PictureRecord& picture, std::span<const uint8_t> file);
Status PictorRead(PictureRecord& picture, std::span<const uint8_t> file, PackedImage& image);
Status PictorDetails(DetailLines& lines, std::span<const uint8_t> file);
// TooManyColors (12) above 8 bits, UnsuitableImage (13) for 1 GiB of pixels or more,
// ErrorCreatingFile (10), ErrorWritingFile (11).
Status PictorWrite(PictureRecord& picture, const WriteOptions& options);

}  // namespace fotomill
