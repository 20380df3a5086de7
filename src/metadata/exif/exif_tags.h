#pragma once

#include <cstdint>
#include <span>
#include <string_view>

namespace fotomill {

// Field types of a TIFF directory entry. Source: TIFF 6.0, section 2.
inline constexpr uint16_t kExifByte = 1;
inline constexpr uint16_t kExifAscii = 2;  // 1 byte, NUL-terminated
inline constexpr uint16_t kExifShort = 3;  // 2 bytes
inline constexpr uint16_t kExifLong = 4;  // 4 bytes
inline constexpr uint16_t kExifRational = 5;  // two LONGs: numerator, denominator
inline constexpr uint16_t kExifSByte = 6;  // 1 byte, signed
inline constexpr uint16_t kExifUndefined = 7;  // 1 byte, meaning depends on the tag
inline constexpr uint16_t kExifSShort = 8;  // 2 bytes, signed
inline constexpr uint16_t kExifSLong = 9;  // 4 bytes, signed
inline constexpr uint16_t kExifSRational = 10;  // two SLONGs

// Bytes per value as the editor counts them: 2 for SHORT, 4 for the long types, 8 for rationals, 1
// for all others, regardless of TIFF.
uint32_t ExifTypeSize(uint16_t type);
// The label shown if `ExifShowTypes` is set, such
// as "[SHORT]". Types are clamped to 1 to 10.
std::string_view ExifTypeLabel(uint16_t type);

// How the value of a tag is displayed, beyond its type.
enum class ExifRule : uint8_t {
  Plain,            // by type
  Words,            // an item of the tag's word list
  Components,       // four bytes, missing ones 0, each an item of the word list
  GpsVersion,       // four bytes joined by dots
  Version,          // characters
  Flash,            // five bit fields
  SubjectArea,      // a point, a circle or a rectangle, by the number of values
  SubjectLocation,  // a point
  Lens,             // minimum and maximum focal length, F-stop at each
  Distance,         // to the subject, in whole meters
  GpsTime,          // three rationals
  Comment,          // text after an 8-byte character code
};

// The kind of values that select a word.
enum class ExifWordKey : uint8_t {
  Number,  // BYTE, SHORT or LONG
  Opaque,  // as Number, or the first byte of UNDEFINED
  Letter,  // the first character of ASCII
};

// A word list: items separated by ";". Without `codes`, the value is the index; with them, the
// index is the value's position in `codes`, or `otherwise` if not found. A word is written as the
// code at its position.
struct ExifWordList {
  std::string_view words;
  ExifWordKey key = ExifWordKey::Number;
  std::span<const uint16_t> codes = {};
  int32_t otherwise = 0;
};

// Edit classes.
inline constexpr uint8_t kExifOrdinary = 0;
// sizes, strips, offsets, color layout: shown, not edited
inline constexpr uint8_t kExifStructural = 1;
inline constexpr uint8_t kExifVersion = 2;
inline constexpr uint8_t kExifOpaque = 7;  // pointers, maker notes, patterns

// A row of the tag dictionary.
struct ExifTag {
  std::string_view name;  // as shown to the user
  uint16_t tag;
  uint8_t editClass;
  // the editor's limits, both 0: none; rationals in thousandths
  int32_t minimum, maximum;
  uint16_t type;             // as written by the editor
  ExifRule rule;
  const ExifWordList* words = nullptr;  // for ExifRule::Words and Components
};

// Index for "not in the dictionary".
inline constexpr int32_t kNoExifTag = -1;

// The dictionary, in the order of the editor's list; each tag
// occurs once. Source: CIPA DC-008-2012, "Exchangeable image
// file format for digital still cameras: Exif Version 2.3".
std::span<const ExifTag> ExifTags();
// Row of a tag, by number alone: GPS tags do not clash with others. Null, or kNoExifTag, if not
// found.
const ExifTag* FindExifTag(uint16_t tag);
int32_t ExifTagIndex(uint16_t tag);
// The display name; "Unknown" if the tag has no row.
std::string_view ExifTagName(uint16_t tag);
// A copy of the row; for a tag without one, a
// plain row with the tag and the name "Unknown".
ExifTag CopyExifTag(uint16_t tag);
// The editor's limits, both 0: none; edit class, 0 for a tag without a row.
struct ExifRange {
  int32_t minimum = 0, maximum = 0;
};
ExifRange ExifTagRange(uint16_t tag);
uint8_t ExifEditClass(uint16_t tag);

}  // namespace fotomill
