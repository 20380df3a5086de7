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
//        4    2  size after the header
//        6    2  file type, 10; subtype, 0 for any device
//        8    4  board and graphics mode
//       12    2  highest index
//       14    6  highest red, green and blue value
//       20    8  "Dr. Halo"
//       28   12  unused
//       40       red, green, blue of each color, 2 bytes each; a color that does not fit into a
//                block starts the next one
//
// Source: J. Murray and W. vanRyper, "Encyclopedia of Graphics File Formats", 2nd edition (1996);
// B. Montgomery, "Picture File Formats" (1990).

// The palette's file name for a picture, with the extension PAL in the same case as the picture's.
std::string HaloPaletteName(const std::string& pictureName);

// Result of reading a picture's palette. Missing and Damaged leave `palette` unchanged.
enum class HaloPaletteResult { Read, Missing, Damaged };
// The extension may be in either case.
HaloPaletteResult ReadHaloPalette(const std::string& pictureName, Palette& palette);

// Writes a palette file and removes it again unless Keep is called; a palette it replaced
// is then restored.
class HaloPaletteFile {
 public:
  HaloPaletteFile() = default;
  HaloPaletteFile(const HaloPaletteFile&) = delete;
  HaloPaletteFile& operator=(const HaloPaletteFile&) = delete;
  ~HaloPaletteFile();

  // Ok; ErrorCreatingFile if `path` exists and is not such a palette or must not
  // be replaced, ErrorWritingFile.
  Status Write(const std::string& path, const Palette& palette, platform::Existing existing);
  void Keep() { path_.clear(); }

 private:
  std::string path_;      // empty: nothing to undo
  std::string previous_;  // contents of the replaced palette
};

}  // namespace fotomill
