#pragma once

#include <cstdint>
#include <optional>
#include <span>
#include <string>
#include <vector>

#include "containers/file_pieces.h"
#include "core/status.h"
#include "metadata/tags/picture_tags.h"

namespace fotomill {

// Changes to the tags of a picture; what is not named stays.
struct TagChanges {
  std::optional<std::vector<std::string>> keywords = {};  // replaces all; empty: none
  // after that, and only those that are not there yet, or are
  std::vector<std::string> addedKeywords = {}, removedKeywords = {};
  std::optional<int32_t> rating = {};           // -1 (rejected) to 5; 0: none
  std::optional<std::string> label = {};        // empty: none
  std::optional<std::string> description = {};  // empty: none

  bool Empty() const;
};

// The keywords after a change.
std::vector<std::string> ChangedKeywords(const std::vector<std::string>& old,
                                         const TagChanges& changes);

// Makes a file with changed tags from pieces of the old one, which must stay valid: in XMP, which
// is added if missing, and in IPTC and EXIF where these hold the same tags. All else stays byte for
// byte. If nothing would change, `changed` is false and `made` is empty. UnsupportedFormat (8) if
// the format has no place for XMP, UnsuitableImage (13), DamagedFile (2) or FileReadError (3) if
// the file cannot be changed safely, with a reason, a sentence.
Status EditPictureTags(std::span<const uint8_t> file, const TagChanges& changes, FilePieces& made,
                       bool& changed, std::string& reason);

// Makes a sidecar with changed tags from the old one, if any, for a picture that has the tags
// `current`, its sidecar included. DamagedFile (2) if the old one cannot be changed safely.
Status EditSidecar(std::span<const uint8_t> sidecar, const PictureTags& current,
                   const TagChanges& changes, std::vector<uint8_t>& made, bool& changed);

}  // namespace fotomill
