#pragma once

#include <cstdint>
#include <span>
#include <string_view>

#include "metadata/exif/exif_value.h"

namespace fotomill {

// One line of the walk. Everything in it holds only until the sink returns; an editor keeps the
// value with CopyExifValue.
struct ExifLine {
  const ExifValue& value;
  std::string_view name;  // of the tag, or "Unknown (50341)"
  std::string_view text;
};

// Receives the lines of a walk: a list, a text, JSON.
class ExifSink {
 public:
  virtual ~ExifSink() = default;
  // A directory begins: its number from 0 and its label, "IFD 0", "EXIF" or "GPS".
  virtual void Directory(int32_t number, std::string_view label) = 0;
  // Called in the order of the block; the line's views hold until it returns.
  virtual void Line(const ExifLine& line) = 0;
};

// For WalkExif: lines of every directory.
inline constexpr int32_t kAllExifDirectories = -1;

// What a walk found beside its lines. Offsets are from the start of the block, 0 for none.
struct ExifFindings {
  uint32_t exifOffset = 0, gpsOffset = 0;           // the first of each that a directory points to
  uint32_t thumbnailOffset = 0, thumbnailSize = 0;  // the last of each
  // a limit ended the walk; the block may hold more
  bool cutShort = false;
};

// Walks an EXIF block: the chain of directories from the header on, then the EXIF and the GPS
// directory that they point to, each once. A directory without entries, one that was walked before,
// and the limits on directories, entries and text end the walk. Lines go to `sink` (none without
// one), those of directory `only` alone when that is a number. False, without any line, when the
// block does not have the magic number 42. Source: TIFF 6.0, section 2; CIPA DC-008-2012,
// section 4.6.
bool WalkExif(std::span<const uint8_t> block, ExifSink* sink, ExifFindings* findings = nullptr,
              int32_t only = kAllExifDirectories);

// The embedded thumbnail that a walk found, a JPEG stream, as a part of the block. Empty if there
// is none or when it is not in the block as a whole.
std::span<const uint8_t> ExifThumbnail(std::span<const uint8_t> block,
                                       const ExifFindings& findings);

}  // namespace fotomill
