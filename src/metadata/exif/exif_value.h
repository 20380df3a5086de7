#pragma once

#include <cstdint>
#include <optional>
#include <span>
#include <string>
#include <string_view>

#include "metadata/exif/exif_bytes.h"
#include "platform/memory.h"

namespace fotomill {

// The values of one entry. `bytes` holds as many of them as the block does, in its byte order;
// values beyond are 0.
struct ExifValue {
  uint16_t tag = 0;
  uint16_t type = 0;
  uint32_t count = 0;  // as the entry claims
  ExifBytes bytes;
};

// The values of an entry of `block`. A SHORT whose entry claims no values is one value, the low
// half of its field.
ExifValue ReadExifValue(std::span<const uint8_t> block, const ExifBytes& numbers,
                        const ExifField& field);

// A value as text: by the rule of the tag's dictionary row (null for tags without one), or else by
// its type. Several numbers are joined by blanks, 16 at most, then " ..."; ASCII ends at its first
// zero byte. No text, not even an empty one, for a value that cannot be put into words: unknown
// types, no values, opaque data. The text is in the block, in a word list, or in `buffer`, and
// holds until the next call with that buffer.
std::optional<std::string_view> ExifValueText(const ExifValue& value, const ExifTag* row,
                                              std::string& buffer);

// Decodes a user comment: `data` begins with the 8-byte character code, `count` is the entry's
// count. An ASCII comment gives its text up to a zero byte, at most `count` - 8 and at most `most`
// characters; the other known codes give a note that they are not supported. False, with `text`
// empty, for an unknown code. `text` is in `data` or is constant.
bool DecodeUserComment(std::span<const uint8_t> data, uint32_t count, size_t most,
                       std::string_view& text);

// An entry's values copied for the editor, whose list keeps one with each line. SHORT values stand
// in 32-bit slots each, with the file's two bytes first and two zero bytes behind; all others as
// they are in the block.
struct ExifRawValue {
  bool bigEndian = false;  // "MM"
  uint16_t tag = 0;
  uint16_t type = 0;
  uint32_t count = 0;  // as the entry claims; `data` holds what of it the block does
  platform::MemoryBlock data;
};
// False, with `copy` empty, if there is no memory.
[[nodiscard]] bool CopyExifValue(const ExifValue& value, ExifRawValue& copy);
// Turns a copy in "MM" order into "II" order in place: a SHORT becomes the upper half of its
// swapped slot, LONG and SLONG and both halves of rationals are swapped, other types stay. A copy
// in "II" order is left alone.
void NormalizeExifValue(ExifRawValue& copy);

}  // namespace fotomill
