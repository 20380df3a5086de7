#pragma once

#include <cstdint>
#include <string_view>

#include "core/status.h"
#include "picture/palette.h"

namespace fotomill {

// Larger files are not color tables.
inline constexpr uint64_t kMostColorTableBytes = 65536;

// Reads the colors of a color table file; the type is detected by its contents:
//   .ccl  lines of "R G B", 0 to 255, in decimal; # starts a comment; blank lines are ignored
//   .act  768 bytes: 256 colors of red, green, blue; optionally 4 more bytes, big-endian: number of
//         colors used, and the transparent one (Adobe Photoshop File Formats Specification, "Color
//         Table")
//   .gpl  "GIMP Palette", header lines of "Name: value", then lines of "R G B name"
//   .pal  "JASC-PAL", "0100", the number of colors, then that many lines of "R G B"
// `count` receives the number of colors, 1 to 256. DamagedFile (2) for anything else, and for less
// than one or more than 256 colors; `palette` and `count` are unchanged then.
Status ReadColorTable(std::string_view contents, Palette& palette, int32_t& count);

}  // namespace fotomill
