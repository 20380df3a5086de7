#pragma once

#include <cstdint>
#include <span>
#include <vector>

#include "core/status.h"

namespace fotomill {

// Copies of files without what tells more than the picture shows: EXIF, XMP, IPTC, comments, texts,
// thumbnails, dates, and everything that is not known to belong to the picture. Compressed pixels,
// palette, transparency, frames, pages, resolution and color profile are the same bytes as before.
// `bare` gets the new file. DamagedFile (2) or FileReadError (3) for a file that is not laid out as
// its format says; nothing is decoded, so that damage within the pixels is not seen.

// What is behind the end of the picture goes as well: further pictures, films.
Status MakeBareJpeg(std::span<const uint8_t> file, std::vector<uint8_t>& bare);
Status MakeBarePng(std::span<const uint8_t> file, std::vector<uint8_t>& bare);
Status MakeBareWebp(std::span<const uint8_t> file, std::vector<uint8_t>& bare);
// Directories and values stay where they are, and what is dropped is overwritten with zeros; the
// end of the file is cut off as far as nothing is left there. The orientation stays: it is a part
// of the picture's own directory.
Status MakeBareTiff(std::span<const uint8_t> file, std::vector<uint8_t>& bare);

}  // namespace fotomill
