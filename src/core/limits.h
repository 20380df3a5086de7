#pragma once

#include <cstdint>

namespace fotomill {

// What one file may cost at most, in one place. Anything beyond is refused before memory is taken
// or a loop is begun.
struct Limits {
  // a packed bitmap: 40-byte header, palette and rows; then status 6
  uint64_t packedBlockBytes = uint64_t{1} << 30;
  uint64_t fileMemoryBytes =
      uint64_t{1200} << 20;  // all that decoding or encoding one file holds, libraries included;
                             // with the program itself below 1.25 GiB; then status 6
  // bytes of a text format scanned without meeting a value
  uint64_t textScanBytes = uint64_t{16} << 20;
  uint64_t listFileBytes = uint64_t{16} << 20;    // an INI, override, history or list file
  uint32_t fitsCards = 65536;                     // cards of one FITS header
  uint32_t exifDirectories = 512;                 // directories of one EXIF block
  uint32_t exifEntries = 65536;                   // entries in all directories of one EXIF block
  uint32_t exifValueCharacters = 4096;            // text of one value
  uint64_t exifTextBytes = uint64_t{4} << 20;     // text of one block
  // frames of one animation; those behind are not shown
  uint32_t animationFrames = 1 << 20;
  // places read beyond a file's head in search of its EXIF
  uint32_t walkedPlaces = 65536;
  uint32_t filePages = 8192;                      // pages of one file; those behind are not shown
  // kept segments of one JPEG file: EXIF, XMP, profile, comments
  uint32_t jpegSegments = 4096;
  // bytes between segments or blocks of a file that belong to none
  uint64_t garbageBytes = uint64_t{1} << 20;
  uint64_t pngTextBytes = uint64_t{16} << 20;     // one inflated text of a PNG file
  uint64_t metadataBytes = uint64_t{64} << 20;    // one EXIF, XMP or ICC block kept with a picture
};

// The limits in force. Changed at start-up only (big machines, tests).
extern Limits limits;

}  // namespace fotomill
