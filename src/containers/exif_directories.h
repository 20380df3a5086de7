#pragma once

#include <cstdint>
#include <span>
#include <vector>

namespace fotomill {

// EXIF in files based on TIFF directories (TIFF, BigTIFF, HD Photo): what
// is one block in other formats is spread over directories among the
// file's own. These functions gather such directories into a block, and
// place a block into a file. Values are copied unchanged; private offsets
// in maker notes are unknown, so some maker notes do not survive.

// One entry, with its values in the byte order of the directories.
struct ExifEntry {
  uint16_t tag = 0, type = 0;
  uint32_t count = 0;
  std::vector<uint8_t> value;
};
// In file order.
using ExifDirectory = std::vector<ExifEntry>;

// The directories of EXIF, independent of a file layout. Pointers between them are omitted and
// recreated on writing.
struct ExifDirectories {
  bool bigEndian = false;
  // the tags of IFD0 that describe the picture, not the file
  ExifDirectory first;
  ExifDirectory exif, gps, interoperability;
  // Whether no directory has an entry.
  bool Empty() const { return first.empty() && exif.empty() && gps.empty(); }
};

// The layout of a file's directories.
struct DirectoryForm {
  bool bigEndian = false;
  bool wide = false;  // BigTIFF: 8-byte counts, 20-byte entries
};

// Reads the directories that the one at `offset` points to. Whatever is beyond the file or the
// limits is left out.
ExifDirectories GatherExif(std::span<const uint8_t> file, const DirectoryForm& form,
                           uint64_t offset);
// As above, from a block starting at the byte order; empty if it is invalid.
ExifDirectories ParseExifBlock(std::span<const uint8_t> block);

// An EXIF block, in the byte order of the directories.
std::vector<uint8_t> MakeExifBlock(const ExifDirectories& directories);
// The block for a file's directories: all of them if they include a camera's, else only the
// orientation if it is not upright, else empty.
std::vector<uint8_t> MakePictureBlock(ExifDirectories directories);

// The EXIF and GPS directories for a little-endian file, where `bytes` will be at offset `base`,
// which must be even.
struct PlacedExif {
  std::vector<uint8_t> bytes;
  uint32_t exifOffset = 0, gpsOffset = 0;  // offsets in the file, 0 if none
};
// Lays out the directories at `base`, in the file's byte order.
PlacedExif PlaceExif(const ExifDirectories& directories, uint32_t base);

// The orientation in IFD0, 1 to 8; 1 if there is none.
uint16_t OrientationOf(const ExifDirectories& directories);
// Sets the orientation in IFD0.
void SetOrientation(ExifDirectories& directories, uint16_t orientation);

}  // namespace fotomill
