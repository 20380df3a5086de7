#pragma once

#include <cstdint>
#include <optional>
#include <span>
#include <string>
#include <string_view>

#include "metadata/exif/exif_bytes.h"
#include "platform/memory.h"

namespace fotomill {

// The values of an entry. `bytes` holds those inside the block, in its byte order; values beyond
// are 0.
struct ExifValue {
  uint16_t tag = 0;
  uint16_t type = 0;
  uint32_t count = 0;  // as stored in the entry
  ExifBytes bytes;
};

// The values of an entry of `block`. A SHORT with count 0 is read as one value, the low half of the
// field.
ExifValue ReadExifValue(std::span<const uint8_t> block, const ExifBytes& numbers,
                        const ExifField& field);

// Formats a value: by the rule of its dictionary row (null for tags without
// one), else by type. Numbers are separated by spaces, 16 at most, then " ...";
// ASCII ends at the first NUL. nullopt (not an empty text) for values without
// text: unknown types, no values, opaque data. The result is in the block, in a
// word list, or in `buffer`, and is valid until the next call with that buffer.
std::optional<std::string_view> ExifValueText(const ExifValue& value, const ExifTag* row,
                                              std::string& buffer);

// Decodes a user comment: `data` begins with the 8-byte character code, `count` is the entry's.
// ASCII yields the text up to a NUL, at most `count` - 8 and at most `most` characters; other known
// codes yield a note that they are not supported. False, with `text` empty, for unknown codes.
// `text` is in `data` or is constant.
bool DecodeUserComment(std::span<const uint8_t> data, uint32_t count, size_t most,
                       std::string_view& text);

// A copy of an entry's values for the editor, which keeps one
// per line. SHORT values take 32-bit slots: the two bytes of the
// file, then two zero bytes; all others are as in the block.
struct ExifRawValue {
  bool bigEndian = false;  // "MM"
  uint16_t tag = 0;
  uint16_t type = 0;
  uint32_t count = 0;  // as stored in the entry; `data` may hold fewer
  platform::MemoryBlock data;
};
// False, with `copy` empty, if out of memory.
[[nodiscard]] bool CopyExifValue(const ExifValue& value, ExifRawValue& copy);
// Converts a copy from "MM" to "II" order in place: a SHORT becomes the upper half of its swapped
// slot, LONG, SLONG and both halves of rationals are swapped, other types stay. Does nothing for
// "II".
void NormalizeExifValue(ExifRawValue& copy);

}  // namespace fotomill
