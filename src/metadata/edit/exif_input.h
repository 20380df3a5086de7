#pragma once

#include <string>
#include <string_view>
#include <vector>

#include "containers/directory_edit.h"

namespace fotomill {

// Parses user input for a tag: the displayed text of a value, or the plain value.
// Words of the tag's list (case-insensitive) or their numbers; rationals as "1/250"
// or "2.8"; several numbers separated by spaces, commas or colons; latitudes and
// longitudes also in decimal degrees; dates as "2024:05:31 14:03:00", also with
// hyphens or a T. The entry's values are little-endian. False, with the reason as a
// sentence, for tags that cannot be edited and for invalid values.
bool ParseExifInput(uint16_t tag, std::string_view text, ExifEntry& entry, std::string& reason);

// The words of a tag's list that can be set, in list order; empty for tags without a list.
std::vector<std::string_view> ExifInputWords(uint16_t tag);

// The directory that the standard assigns to a tag.
ExifPlace PlaceOfExifTag(uint16_t tag);

// A text entry with a terminating NUL; an entry of unsigned rationals.
ExifEntry ExifTextEntry(uint16_t tag, std::string_view text);
struct ExifFraction {
  uint32_t numerator = 0, denominator = 1;
};
ExifEntry ExifRationalEntry(uint16_t tag, std::initializer_list<ExifFraction> values);

}  // namespace fotomill
