#pragma once

#include <cstdint>
#include <optional>
#include <span>
#include <string>
#include <string_view>
#include <vector>

#include "containers/file_pieces.h"
#include "core/status.h"

namespace fotomill {

// Files without what tells more than the picture shows: EXIF with thumbnail, GPS and maker notes,
// XMP, IPTC, comments, texts and times, blocks of other programs, further pictures inside.
// Compressed pixels are never touched. What is removed is nowhere in the new file.

// What stays when all else goes, as a set of bits.
inline constexpr uint32_t kKeepOrientation = 1;
inline constexpr uint32_t kKeepProfile = 2;
inline constexpr uint32_t kKeepCopyright = 4;  // the entries of creator and copyright
inline constexpr uint32_t kKeepExif = 8;  // the camera's entries but for GPS, thumbnail, maker notes
inline constexpr uint32_t kKeepGps = 16;
inline constexpr uint32_t kKeepXmp = 32;
inline constexpr uint32_t kKeepIptc = 64;
inline constexpr uint32_t kKeepComments = 128;  // and PNG texts
// Unless said otherwise.
inline constexpr uint32_t kKeepUsually = kKeepOrientation | kKeepProfile;

// The names of these, in English.
struct KeptName {
  std::string_view name;
  uint32_t bit;
};
std::span<const KeptName> KeptNames();

// Makes a file with nothing but the picture and what is kept, from parts of the old one, which must
// stay. Statuses and reason as of EditPictureExif.
Status StripPicture(std::span<const uint8_t> file, uint32_t kept, FilePieces& made,
                    std::string& reason);

// Makes a file without its places: the GPS directory of EXIF, also in pictures behind the first,
// and the places in XMP. Everything else stays the same bytes at the same offsets. Statuses and
// reason as above.
Status StripPlaces(std::span<const uint8_t> file, FilePieces& made, std::string& reason);

// What a file has beside its picture, as short names in English that are to be translated:
// "orientation", "color profile", "EXIF", ...
std::vector<const char*> MetadataLeft(std::span<const uint8_t> file);

}  // namespace fotomill
