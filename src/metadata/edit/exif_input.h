#pragma once

#include <string>
#include <string_view>

#include "containers/directory_edit.h"

namespace fotomill {

// Reads what people type for a tag: the text in which its value is shown, or the plain value. Words
// of its list in any case or their numbers; rationals as "1/250" or "2.8"; several numbers with
// blanks, commas or colons between them; latitudes and longitudes also in decimal degrees; dates as
// "2024:05:31 14:03:00", with hyphens or a T too. The entry's values are little-endian. False, with
// the reason as a whole sentence, for tags that are not to be edited, and for values that the
// dictionary does not allow.
bool ParseExifInput(uint16_t tag, std::string_view text, ExifEntry& entry, std::string& reason);

// The directory in which the standard keeps a tag.
ExifPlace PlaceOfExifTag(uint16_t tag);

// The entry of a text, with its closing zero, and of unsigned rationals from pairs of numbers.
ExifEntry ExifTextEntry(uint16_t tag, std::string_view text);
struct ExifFraction {
  uint32_t numerator = 0, denominator = 1;
};
ExifEntry ExifRationalEntry(uint16_t tag, std::initializer_list<ExifFraction> values);

}  // namespace fotomill
