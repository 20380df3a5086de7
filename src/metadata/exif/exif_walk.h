#pragma once

#include <cstdint>
#include <span>
#include <string_view>

#include "metadata/exif/exif_value.h"

namespace fotomill {

// One line of the walk. Valid only until the sink
// returns; use CopyExifValue to keep the value.
struct ExifLine {
  const ExifValue& value;
  std::string_view name;  // of the tag; else "Unknown (50341)"
  std::string_view text;
};

// Receives the lines of a walk: for a list, text or JSON.
class ExifSink {
 public:
  virtual ~ExifSink() = default;
  // Start of a directory: its number from 0 and its label, "IFD 0", "EXIF" or "GPS".
  virtual void Directory(int32_t number, std::string_view label) = 0;
  // Called in block order; the line is valid until it returns.
  virtual void Line(const ExifLine& line) = 0;
};

// For WalkExif: list every directory.
inline constexpr int32_t kAllExifDirectories = -1;

// What else a walk found. Offsets are from the start of the block; 0: none.
struct ExifFindings {
  uint32_t exifOffset = 0, gpsOffset = 0;           // the first of each
  uint32_t thumbnailOffset = 0, thumbnailSize = 0;  // the last of each
  // a limit ended the walk; there may be more
  bool cutShort = false;
};

// Walks an EXIF block: the chain of directories from the header, then the EXIF
// and GPS directories they point to, each once. Ends at an empty or already
// visited directory and at the limits on directories, entries and text. Lines
// go to `sink` (may be null), only those of directory `only` if it is a
// number. False, without any line, if the block does not have the magic number
// 42. Source: TIFF 6.0, section 2; CIPA DC-008-2012, section 4.6.
bool WalkExif(std::span<const uint8_t> block, ExifSink* sink, ExifFindings* findings = nullptr,
              int32_t only = kAllExifDirectories);

// The embedded thumbnail found by a walk, a JPEG stream inside the block. Empty if there is none or
// it is not entirely inside the block.
std::span<const uint8_t> ExifThumbnail(std::span<const uint8_t> block,
                                       const ExifFindings& findings);

}  // namespace fotomill
