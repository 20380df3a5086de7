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

// Edits the directories of a TIFF structure: an EXIF block, or a TIFF,
// BigTIFF or HD Photo file. Only changed parts move: maker notes, pixels and
// all other directories keep their offsets. Whatever no longer fits in place
// is appended at the end, as are directories that grow. Old bytes of removed
// or replaced values are zeroed, unless they are shared with something else.

// The directories with a camera's entries; the first is the picture's own.
enum class ExifPlace : uint8_t { First, Exif, Gps };

// An entry that replaces those with its tag, is added, or is removed. Its values are little-endian,
// whatever the structure's byte order.
struct DirectoryChange {
  ExifPlace place = ExifPlace::First;
  uint16_t tag = 0;
  std::optional<ExifEntry> entry = {};  // none: remove the tag
  // remove the whole directory, ignoring the tag; GPS: those of all pages
  bool all = false;
};

// The resulting changes to the file.
struct DirectoryEdit {
  struct Patch {
    uint64_t at = 0;
    std::vector<uint8_t> bytes;
  };
  std::vector<Patch> patches;  // ascending, without overlaps
  std::vector<uint8_t> tail;   // appended to the file, padding included
  bool Empty() const { return patches.empty() && tail.empty(); }
};

// Computes an edit, which is empty if nothing changes. A directory that becomes empty is removed
// with its pointer. DamagedFile (2) if it is not such a structure, UnsuitableImage (13) if it
// cannot grow, each with a reason, a whole sentence.
Status EditDirectories(std::span<const uint8_t> file, std::span<const DirectoryChange> changes,
                       DirectoryEdit& edit, std::string& reason);

// The edited bytes as parts of a new file, or as a separate block.
void AddEdited(std::span<const uint8_t> file, DirectoryEdit edit, FilePieces& pieces);
std::vector<uint8_t> EditedBlock(std::span<const uint8_t> block, DirectoryEdit edit);

// The values of the entries with a tag in all directories, as stored, in no particular order. Those
// beyond the end of the file are left out.
struct DirectoryValue {
  uint16_t type = 0;
  std::span<const uint8_t> bytes = {};
};
std::vector<DirectoryValue> FindDirectoryValues(std::span<const uint8_t> file, uint16_t tag);
// As above, in the first directory; empty if it does not have the tag.
DirectoryValue FirstDirectoryValue(std::span<const uint8_t> file, uint16_t tag);

// Swaps the byte order of the numbers in values of a type.
void SwapExifNumbers(uint16_t type, std::span<uint8_t> values);

}  // namespace fotomill
