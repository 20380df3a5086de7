#pragma once

#include <cstdint>
#include <optional>
#include <span>
#include <string>
#include <vector>

#include "containers/exif_directories.h"
#include "containers/file_pieces.h"
#include "core/status.h"

namespace fotomill {

// Changes to the directories of a TIFF structure: an EXIF block, or a TIFF, BigTIFF or HD Photo
// file. Nothing moves but what is changed: maker notes, pixels and all other directories stay at
// their offsets. What does not fit where it was goes behind the end, with a directory that grows.
// The old bytes of a value that is removed or replaced become zeros, unless something else is there
// too.

// The directories that a camera's entries are in; the first is the picture's own.
enum class ExifPlace : uint8_t { First, Exif, Gps };

// One entry that is put in place of those with its tag, is added, or is removed. Its values are
// little-endian, whatever the structure is.
struct DirectoryChange {
  ExifPlace place = ExifPlace::First;
  uint16_t tag = 0;
  std::optional<ExifEntry> entry = {};  // none: it is removed
  bool all = false;                     // the whole directory is removed, whatever its tags
};

// What becomes of the bytes.
struct DirectoryEdit {
  struct Patch {
    uint64_t at = 0;
    std::vector<uint8_t> bytes;
  };
  std::vector<Patch> patches;  // ascending; they do not overlap
  std::vector<uint8_t> tail;   // behind the end, padding included
  bool Empty() const { return patches.empty() && tail.empty(); }
};

// Works out an edit, which is empty where the entries are so already. A directory whose last entry
// goes is left out with its pointer. DamagedFile (2) for what is no such structure, UnsuitableImage
// (13) where it cannot grow, each with a reason, a whole sentence.
Status EditDirectories(std::span<const uint8_t> file, std::span<const DirectoryChange> changes,
                       DirectoryEdit& edit, std::string& reason);

// The edited bytes as parts of a new file, or as a block of their own.
void AddEdited(std::span<const uint8_t> file, DirectoryEdit edit, FilePieces& pieces);
std::vector<uint8_t> EditedBlock(std::span<const uint8_t> block, DirectoryEdit edit);

// The values of an entry of a structure's first directory, as they are in the file; no bytes if it
// has none, or does not hold them.
struct DirectoryValue {
  uint16_t type = 0;
  std::span<const uint8_t> bytes = {};
};
DirectoryValue FindDirectoryValue(std::span<const uint8_t> file, uint16_t tag);

// Reverses the bytes of each number in values of a type: from one byte order to the other.
void SwapExifNumbers(uint16_t type, std::span<uint8_t> values);

}  // namespace fotomill
