#pragma once

#include <string>

#include "core/status.h"
#include "picture/palette.h"
#include "platform/output_file.h"

namespace fotomill {

// Palettes of Dr. Halo (PAL), little-endian, in blocks of 512 bytes.
//
//   offset size  field
//        0    2  "AH"
//        2    2  version, 0xE3
//        4    2  bytes behind the header
//        6    2  type of the file, 10; subtype, 0 for any device
//        8    4  board and graphics mode
//       12    2  highest index
//       14    6  highest red, green and blue value
//       20    8  "Dr. Halo"
//       28   12  nothing
//       40       red, green, blue of each color, 2 bytes each; a color that does not fit into a
//                block begins the next one
//
// Source: J. Murray and W. vanRyper, "Encyclopedia of Graphics File Formats", 2nd edition (1996);
// B. Montgomery, "Picture File Formats" (1990).

// The name of the palette of a picture: its extension is PAL in the case of the picture's own.
std::string HaloPaletteName(const std::string& pictureName);

// What became of reading the palette of a picture. Missing and Damaged leave `palette` as it is.
enum class HaloPaletteResult { Read, Missing, Damaged };
// Of a picture of that name, whatever the case of the palette's extension.
HaloPaletteResult ReadHaloPalette(const std::string& pictureName, Palette& palette);

// Puts a palette in place and takes it away again unless Keep is called: a palette that it
// replaced comes back.
class HaloPaletteFile {
 public:
  HaloPaletteFile() = default;
  HaloPaletteFile(const HaloPaletteFile&) = delete;
  HaloPaletteFile& operator=(const HaloPaletteFile&) = delete;
  ~HaloPaletteFile();

  // Ok; ErrorCreatingFile when `path` is there and is no such palette or must not be replaced,
  // ErrorWritingFile.
  Status Write(const std::string& path, const Palette& palette, platform::Existing existing);
  void Keep() { path_.clear(); }

 private:
  std::string path_;      // empty: nothing is to be undone
  std::string previous_;  // contents of the palette that was replaced
};

}  // namespace fotomill
