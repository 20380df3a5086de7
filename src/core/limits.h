#pragma once

#include <cstdint>

namespace fotomill {

// Resource limits for one file. Anything beyond is rejected before memory is allocated or
// a loop starts.
struct Limits {
  // a packed bitmap: 40-byte header, palette and rows; status 6
  uint64_t packedBlockBytes = uint64_t{1} << 30;
  uint64_t fileMemoryBytes =
      uint64_t{1200} << 20;  // memory to decode or encode one file, libraries included; 1.25 GiB
                             // with the program itself; then status 6
  // bytes of a text format scanned without finding a value
  uint64_t textScanBytes = uint64_t{16} << 20;
  uint64_t listFileBytes = uint64_t{16} << 20;    // an INI, override, history or list file
  uint32_t fitsCards = 65536;                     // cards of one FITS header
  uint32_t exifDirectories = 512;                 // directories of one EXIF block
  uint32_t exifEntries = 65536;                   // entries in all directories of one EXIF block
  uint32_t exifValueCharacters = 4096;            // text of one value
  uint64_t exifTextBytes = uint64_t{4} << 20;     // text of one block
  // frames of one animation; later ones are not shown
  uint32_t animationFrames = 1 << 20;
  // offsets visited past a file's header in search of its EXIF
  uint32_t walkedPlaces = 65536;
  uint32_t filePages = 8192;                      // pages of one file; later ones are not shown
  // metadata segments of one JPEG file: EXIF, XMP, profile, comments
  uint32_t jpegSegments = 4096;
  // unrecognized bytes between the segments or blocks of a file
  uint64_t garbageBytes = uint64_t{1} << 20;
  uint64_t pngTextBytes = uint64_t{16} << 20;     // one inflated text of a PNG file
  uint64_t metadataBytes = uint64_t{64} << 20;    // one EXIF, XMP or ICC block kept with a picture
};

// The limits in effect. Changed only at start-up (big machines, tests).
extern Limits limits;

}  // namespace fotomill
