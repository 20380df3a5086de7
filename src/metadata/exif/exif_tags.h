#pragma once

#include <cstdint>
#include <span>
#include <string_view>

namespace fotomill {

// Field types of a TIFF directory entry. Source: TIFF 6.0, section 2.
inline constexpr uint16_t kExifByte = 1;
inline constexpr uint16_t kExifAscii = 2;  // 1 byte, with a closing zero
inline constexpr uint16_t kExifShort = 3;  // 2 bytes
inline constexpr uint16_t kExifLong = 4;  // 4 bytes
inline constexpr uint16_t kExifRational = 5;  // two LONGs: numerator, denominator
inline constexpr uint16_t kExifSByte = 6;  // 1 byte, signed
inline constexpr uint16_t kExifUndefined = 7;  // 1 byte, meant as the tag says
inline constexpr uint16_t kExifSShort = 8;  // 2 bytes, signed
inline constexpr uint16_t kExifSLong = 9;  // 4 bytes, signed
inline constexpr uint16_t kExifSRational = 10;  // two SLONGs

// Bytes of one value of a type in the editor's sense: 2 for SHORT, 4 and 8 for the long types and
// the rationals, 1 for every other number, whatever TIFF says of it.
uint32_t ExifTypeSize(uint16_t type);
// The label that the list shows when `ExifShowTypes` is set, such as "[SHORT]". Types below 1 count
// as 1, above 10 as 10.
std::string_view ExifTypeLabel(uint16_t type);

// How a tag's value is put into words, beyond what its type alone says.
enum class ExifRule : uint8_t {
  Plain,            // by type
  Words,            // an item of the tag's word list
  Components,       // four bytes, 0 where there are fewer, an item of the word list each
  GpsVersion,       // four bytes joined by dots
  Version,          // characters
  Flash,            // five fields of bits
  SubjectArea,      // a point, a circle or a rectangle, by the number of values
  SubjectLocation,  // a point
  Lens,             // shortest and longest focal length, F-stop at each
  Distance,         // of the subject, in whole meters
  GpsTime,          // three rationals
  Comment,          // text behind an 8-byte character code
};

// Which values a word list takes.
enum class ExifWordKey : uint8_t {
  Number,  // BYTE, SHORT or LONG
  Opaque,  // those, or the first byte of UNDEFINED
  Letter,  // the first character of ASCII
};

// A word list: items separated by ";" and picked by index. Without `codes` the index is the value
// itself, with them it is the value's position among them, or `otherwise` when it is not there. A
// word is written as the code at its position.
struct ExifWordList {
  std::string_view words;
  ExifWordKey key = ExifWordKey::Number;
  std::span<const uint16_t> codes = {};
  int32_t otherwise = 0;
};

// What the editor may do with a tag.
inline constexpr uint8_t kExifOrdinary = 0;
// sizes, strips, offsets, color layout: shown, not edited
inline constexpr uint8_t kExifStructural = 1;
inline constexpr uint8_t kExifVersion = 2;
inline constexpr uint8_t kExifOpaque = 7;  // pointers, maker notes, patterns

// One row of the tag dictionary.
struct ExifTag {
  std::string_view name;  // as shown to the user
  uint16_t tag;
  uint8_t editClass;
  // accepted by the editor, both 0 when unbounded; rationals in thousandths
  int32_t minimum, maximum;
  uint16_t type;             // in which the editor writes the value
  ExifRule rule;
  const ExifWordList* words = nullptr;  // for ExifRule::Words and Components
};

// Stands for no row of the dictionary.
inline constexpr int32_t kNoExifTag = -1;

// The dictionary in the order in which the editor offers it; each tag number is in it once.
// Source: CIPA DC-008-2012, "Exchangeable image file format for digital still cameras: Exif
// Version 2.3".
std::span<const ExifTag> ExifTags();
// Row of a tag, by number alone: GPS tags and the others do not clash. Null, or kNoExifTag, if
// there is none.
const ExifTag* FindExifTag(uint16_t tag);
int32_t ExifTagIndex(uint16_t tag);
// The display name; "Unknown" for a tag without a row.
std::string_view ExifTagName(uint16_t tag);
// A copy of the row; for a tag without one, a plain row with the name "Unknown" and the number
// filled in.
ExifTag CopyExifTag(uint16_t tag);
// The editor's bounds, both 0 if there are none, and the edit class, 0 for a tag without a row.
struct ExifRange {
  int32_t minimum = 0, maximum = 0;
};
ExifRange ExifTagRange(uint16_t tag);
uint8_t ExifEditClass(uint16_t tag);

}  // namespace fotomill
