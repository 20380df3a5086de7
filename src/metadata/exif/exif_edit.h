#pragma once

#include <cstdint>
#include <span>
#include <vector>

namespace fotomill {

// Edits of an EXIF block that a writer copies to its output. They only change what they name and
// keep all other bytes at their offsets, since maker notes may point anywhere in the block. Blocks
// start with the byte order; a block without TIFF header, or too damaged for the edit, is left
// unchanged.

// Orientation of the picture, 1 to 8; 1
// if missing or invalid.
int32_t ExifOrientation(std::span<const uint8_t> block);

// Properties of the new picture; 0: keep the old value.
struct ExifPictureFacts {
  int32_t width = 0, height = 0;  // pixels
  int32_t orientation = 0;        // 1 to 8
};
// Updates existing tags in place: orientation and image size in the first directory, valid image
// size in the EXIF directory. Adds none. An entry of another type becomes a single SHORT, or LONG
// if needed.
void SetExifPictureFacts(std::span<uint8_t> block, const ExifPictureFacts& facts);

// Sets the orientation, adding an entry if needed: then the first directory moves to the end of the
// block. An empty block becomes one with nothing else. False, with the block unchanged, if it has
// no TIFF header or no first directory.
[[nodiscard]] bool PutExifOrientation(std::vector<uint8_t>& block, int32_t orientation);

// Removes the thumbnail: ends the chain after the first directory; overwrites later directories,
// their values and the thumbnail with zeros, except where they overlap other data, and cuts
// trailing zeros off the block.
void DropExifThumbnail(std::vector<uint8_t>& block);

// Replaces the thumbnail, if any, by the JPEG stream `thumbnail`, with a
// new second directory at the end of the block. False, with the thumbnail
// removed, if there is no first directory to chain it to or if the block
// would exceed `most` bytes (a JPEG segment has room for 65527).
[[nodiscard]] bool ReplaceExifThumbnail(std::vector<uint8_t>& block,
                                        std::span<const uint8_t> thumbnail, uint64_t most);

}  // namespace fotomill
