#pragma once

#include <cstdint>
#include <optional>
#include <span>
#include <string>
#include <string_view>
#include <vector>

#include "containers/file_pieces.h"
#include "core/status.h"
#include "texts/texts.h"

namespace fotomill {

// The reason for refusing other files.
inline constexpr const char* kNotStripped =
    TrLater("Metadata can be removed from JPEG, TIFF, PNG, WebP, HD Photo, GIF and PSD files.");

// Removes metadata: EXIF with thumbnail, GPS and maker notes, XMP, IPTC, comments, texts and times,
// data of other programs, embedded pictures. Compressed pixels are never touched. No byte of the
// removed data remains in the new file.

// Flags for what to keep.
inline constexpr uint32_t kKeepOrientation = 1;
inline constexpr uint32_t kKeepProfile = 2;
inline constexpr uint32_t kKeepCopyright = 4;  // creator and copyright
inline constexpr uint32_t kKeepExif = 8;       // except GPS, thumbnail, maker notes
inline constexpr uint32_t kKeepGps = 16;
inline constexpr uint32_t kKeepXmp = 32;
inline constexpr uint32_t kKeepIptc = 64;
inline constexpr uint32_t kKeepComments = 128;  // and PNG texts
// The default.
inline constexpr uint32_t kKeepUsually = kKeepOrientation | kKeepProfile;

// Their English names.
struct KeptName {
  std::string_view name;
  uint32_t bit;
};
std::span<const KeptName> KeptNames();

// Makes a file with only the picture and the kept metadata, from pieces of the old one, which must
// stay valid. Statuses and reason as EditPictureExif.
Status StripPicture(std::span<const uint8_t> file, uint32_t kept, FilePieces& made,
                    std::string& reason);

// Removes positions: the EXIF GPS directory, also in embedded
// pictures, and the positions in XMP. All other bytes stay the
// same, at the same offsets. Statuses and reason as above.
Status StripPlaces(std::span<const uint8_t> file, FilePieces& made, std::string& reason);

// Short untranslated names of the metadata in a
// file: "orientation", "color profile", "EXIF", ...
std::vector<const char*> MetadataLeft(std::span<const uint8_t> file);

}  // namespace fotomill
