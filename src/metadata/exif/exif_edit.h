#pragma once

#include <cstdint>
#include <span>
#include <vector>

namespace fotomill {

// Changes that a writer makes to an EXIF block that it carries over. They touch what they name and
// leave every other byte where it is, since maker notes may point anywhere into the block. Blocks
// are bare, from their byte order on; one without a TIFF header, or too damaged to hold what is
// looked for, is left alone.

// Orientation of the picture, 1 to 8; 1 when the first directory does not say or says anything
// else.
int32_t ExifOrientation(std::span<const uint8_t> block);

// Numbers that a new form of the picture brings along; 0 leaves what the block says.
struct ExifPictureFacts {
  int32_t width = 0, height = 0;  // pixels
  int32_t orientation = 0;        // 1 to 8
};
// Sets the numbers in place in the tags that are there: orientation and image size in the first
// directory, valid image size in the EXIF directory. Adds none. An entry of another type becomes a
// single SHORT, or LONG where it needs to.
void SetExifPictureFacts(std::span<uint8_t> block, const ExifPictureFacts& facts);

// Sets the orientation, also where the block does not tell one: its first directory moves to the
// end of the block then, with an entry more, and an empty block becomes one that tells nothing
// else. False, with the block unchanged, where it has no TIFF header or no first directory.
[[nodiscard]] bool PutExifOrientation(std::vector<uint8_t>& block, int32_t orientation);

// Takes the thumbnail out: the chain ends behind the first directory; the directories behind it,
// their values and the thumbnail are overwritten with zeros, as far as nothing else is there, and
// cut off where they end the block.
void DropExifThumbnail(std::vector<uint8_t>& block);

// Puts the JPEG stream `thumbnail` in the place of the block's thumbnail, if any, with a second
// directory of its own at the end of the block. False, with the thumbnail dropped, when the block
// has no first directory to chain it to or would grow beyond `most` bytes (a JPEG file's segment
// has room for 65527).
[[nodiscard]] bool ReplaceExifThumbnail(std::vector<uint8_t>& block,
                                        std::span<const uint8_t> thumbnail, uint64_t most);

}  // namespace fotomill
