#pragma once

#include <cstdint>
#include <span>
#include <vector>

#include "core/status.h"

namespace fotomill {

// Copies of files stripped of private data: EXIF, XMP, IPTC, comments, texts, thumbnails, dates,
// and everything not known to belong to the picture. Compressed pixels, palette, transparency,
// frames, pages, resolution and color profile are copied byte for byte. `bare` receives the new
// file. DamagedFile (2) or FileReadError (3) if the file's structure is invalid; nothing is
// decoded, so damaged pixels go unnoticed.

// Also removes everything after the end of the picture: further pictures, movies.
Status MakeBareJpeg(std::span<const uint8_t> file, std::vector<uint8_t>& bare);
Status MakeBarePng(std::span<const uint8_t> file, std::vector<uint8_t>& bare);
Status MakeBareWebp(std::span<const uint8_t> file, std::vector<uint8_t>& bare);
// Directories and values keep their offsets, and removed ones are overwritten with zeros; the file
// is truncated after the last byte in use. The orientation is kept, as it is part of the picture's
// own directory.
Status MakeBareTiff(std::span<const uint8_t> file, std::vector<uint8_t>& bare);

}  // namespace fotomill
