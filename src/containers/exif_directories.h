#pragma once

#include <cstdint>
#include <span>
#include <vector>

namespace fotomill {

// EXIF in files that are built of TIFF's directories themselves (TIFF, BigTIFF, HD Photo): what is
// one block elsewhere is spread there over directories among the file's own. These functions gather
// such directories into a block, and spread a block over a file. A directory's values move as they
// are; offsets that a maker note keeps in its own form cannot be known, so some makers' notes do
// not survive the move.

// One entry: its values are behind each other, in the byte order of the set.
struct ExifEntry {
  uint16_t tag = 0, type = 0;
  uint32_t count = 0;
  std::vector<uint8_t> value;
};
// In the order in which they are in the file.
using ExifDirectory = std::vector<ExifEntry>;

// The directories of a camera's EXIF, in no file's form. Pointers between them are left out; they
// are made anew.
struct ExifDirectories {
  bool bigEndian = false;
  // what the first directory says of the picture, not of the file that holds it
  ExifDirectory first;
  ExifDirectory exif, gps, interoperability;
  // No directory has an entry.
  bool Empty() const { return first.empty() && exif.empty() && gps.empty(); }
};

// How a file lays out its directories.
struct DirectoryForm {
  bool bigEndian = false;
  bool wide = false;  // BigTIFF: counts of 8 bytes, entries of 20
};

// Takes the directories that the one at `offset` leads to. What is not in the file, or is beyond
// the limits, is left out.
ExifDirectories GatherExif(std::span<const uint8_t> file, const DirectoryForm& form,
                           uint64_t offset);
// The same of a block from its byte order on; empty if it is invalid.
ExifDirectories ParseExifBlock(std::span<const uint8_t> block);

// A block of its own, in the set's byte order.
std::vector<uint8_t> MakeExifBlock(const ExifDirectories& directories);
// The block of a file's directories: all of them where a camera's are among them, else the
// orientation alone where the picture is not upright, else none.
std::vector<uint8_t> MakePictureBlock(ExifDirectories directories);

// The EXIF and GPS directories for a little-endian file, in which `bytes` will be from `base` on,
// an even place.
struct PlacedExif {
  std::vector<uint8_t> bytes;
  uint32_t exifOffset = 0, gpsOffset = 0;  // in the file, 0 for none
};
// Lays them out for `base`; numbers are turned into the file's byte order.
PlacedExif PlaceExif(const ExifDirectories& directories, uint32_t base);

// The orientation that the first directory tells, 1 to 8; 1 when it does not.
uint16_t OrientationOf(const ExifDirectories& directories);
// Puts the entry into the first directory, in place of one that is there.
void SetOrientation(ExifDirectories& directories, uint16_t orientation);

}  // namespace fotomill
