#pragma once

#include <cstdint>
#include <functional>
#include <span>
#include <string>
#include <vector>

#include "containers/directory_edit.h"
#include "containers/file_pieces.h"
#include "containers/metadata_rewrite.h"
#include "core/status.h"

namespace fotomill {

// How a file stores metadata, determined from its contents.
enum class MetadataForm : uint8_t {
  None,  // unknown format
  Jpeg,
  Png,
  Webp,
  Tiff,  // also BigTIFF and bare EXIF blocks: entries are in the file's own directories
  HdPhoto,
  Gif,  // XMP only
  Psd,  // EXIF is not changed
};
MetadataForm MetadataFormOf(std::span<const uint8_t> file);
// Whether EXIF of such files can be changed.
bool HasEditableExif(MetadataForm form);

// How to find and replace metadata in formats with separate blocks for them; null for others.
struct FormOperations {
  Status (*find)(std::span<const uint8_t> file, MetadataViews& views) = nullptr;
  Status (*rewrite)(std::span<const uint8_t> file, const MetadataBlocks& blocks, FilePieces& made,
                    std::string& reason) = nullptr;
};
FormOperations OperationsOf(MetadataForm form);

// The EXIF entries of a file, values in its byte
// order; empty if there are none that can be read.
ExifDirectories GatherPictureExif(std::span<const uint8_t> file);

// The first value of an entry as text, without trailing spaces and NULs; empty for other types.
std::string ExifEntryText(const ExifEntry& entry);
// Null if not found.
const ExifEntry* FindExifEntry(const ExifDirectory& directory, uint16_t tag);

// Computes changes from the current entries. To fail, set `reason` (a sentence).
using ExifChanges = std::vector<DirectoryChange>;
using ExifChanger = std::function<ExifChanges(const ExifDirectories& old, std::string& reason)>;

// Makes a file with changed EXIF from pieces of the old one, which must stay valid. Everything else
// is kept byte for byte. If nothing would change, `changed` is false and `made` is empty.
// UnsupportedFormat (8) for other file types, DamagedFile (2), FileReadError (3); UnsuitableImage
// (13) if the file cannot be changed without loss, InformationError (7) if the changer failed.
// `reason` has details as a sentence, if any.
Status EditPictureExif(std::span<const uint8_t> file, const ExifChanger& changer, FilePieces& made,
                       bool& changed, std::string& reason);

}  // namespace fotomill
