#pragma once

#include <cstdint>
#include <string_view>

#include "core/status.h"
#include "picture/palette.h"

namespace fotomill {

// Files larger than this are not color tables.
inline constexpr uint64_t kMostColorTableBytes = 65536;

// Reads the colors of a color table file, told by its contents:
//   .ccl  lines of "R G B", 0 to 255, in decimal; # begins a comment; blank lines count for nothing
//   .act  768 bytes: 256 colors of red, green, blue; 4 more bytes hold the number of colors that
//   count and the transparent
//         one, big-endian (Adobe Photoshop File Formats Specification, "Color Table")
//   .gpl  "GIMP Palette", header lines of "Name: value", then lines of "R G B name"
//   .pal  "JASC-PAL", "0100", the number of colors, then that many lines of "R G B"
// `count` gets the number of colors, 1 to 256. DamagedFile (2) for anything else, with less than
// one color and with more than 256; `palette` and `count` are unchanged then.
Status ReadColorTable(std::string_view contents, Palette& palette, int32_t& count);

}  // namespace fotomill
