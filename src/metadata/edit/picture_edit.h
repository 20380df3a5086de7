#pragma once

#include <cstdint>
#include <functional>
#include <span>
#include <string>
#include <vector>

#include "containers/directory_edit.h"
#include "containers/file_pieces.h"
#include "core/status.h"

namespace fotomill {

// How a file holds its metadata, by its contents.
enum class MetadataForm : uint8_t {
  None,  // not at all that we know of
  Jpeg,
  Png,
  Webp,
  Tiff,  // BigTIFF and bare EXIF blocks too: entries are among the file's own
  HdPhoto,
};
MetadataForm MetadataFormOf(std::span<const uint8_t> file);

// The camera's entries of a file, values in the set's byte order; empty if it has none that can be
// read.
ExifDirectories GatherPictureExif(std::span<const uint8_t> file);

// The first value of an entry as text, without blanks and zeros at its end; empty for other types.
std::string ExifEntryText(const ExifEntry& entry);
// An entry of a directory, or null.
const ExifEntry* FindExifEntry(const ExifDirectory& directory, uint16_t tag);

// What is changed, worked out from what the file holds. A reason is a failure, as a whole sentence.
using ExifChanges = std::vector<DirectoryChange>;
using ExifChanger =
    std::function<ExifChanges(const ExifDirectories& old, std::string& reason)>;

// Makes a file with changed EXIF from parts of the old one, which must stay. All that is not
// changed stays byte for byte; `changed` is false, and nothing made, where it is so already.
// UnsupportedFormat (8) for other kinds of files, DamagedFile (2), FileReadError (3) and
// UnsuitableImage (13) where the file cannot be changed without losing something, InformationError
// (7) where the changer failed, each with a reason, a whole sentence, if there is more to say.
Status EditPictureExif(std::span<const uint8_t> file, const ExifChanger& changer, FilePieces& made,
                       bool& changed, std::string& reason);

}  // namespace fotomill
