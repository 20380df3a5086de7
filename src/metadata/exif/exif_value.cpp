#include "metadata/exif/exif_value.h"

#include <algorithm>
#include <charconv>
#include <cstring>

#include "core/limits.h"
#include "core/text.h"

namespace fotomill {

namespace {

using Text = std::optional<std::string_view>;

constexpr uint32_t kMostNumbers = 16;  // per value that are shown
constexpr size_t kCodeSize = 8;        // character code of a user comment
constexpr std::string_view kJisCode("JIS\0\0\0\0\0", kCodeSize);

// --- numbers, appended to `buffer` ---

void AddNumber(std::string& buffer, int64_t number) {
  char digits[24];
  const auto end = std::to_chars(digits, digits + sizeof digits, number).ptr;
  buffer.append(digits, static_cast<size_t>(end - digits));
}

void AddTwoDigits(std::string& buffer, uint32_t number) {
  if (number < 10) buffer += '0';
  AddNumber(buffer, number);
}

void AddFixed(std::string& buffer, double number, int decimals) {
  char digits[32];  // at most 2^32 before the point
  const auto end =
      std::to_chars(digits, digits + sizeof digits, number, std::chars_format::fixed, decimals).ptr;
  buffer.append(digits, static_cast<size_t>(end - digits));
}

struct Rational {
  int64_t numerator, denominator;
  double Value() const {
    return denominator == 0 ? 0.0
                            : static_cast<double>(numerator) / static_cast<double>(denominator);
  }
};

Rational RationalAt(const ExifValue& value, uint64_t index) {
  const uint32_t numerator = value.bytes.U32(8 * index),
                 denominator = value.bytes.U32(8 * index + 4);
  if (value.type != kExifSRational) return {numerator, denominator};
  return {static_cast<int32_t>(numerator), static_cast<int32_t>(denominator)};
}

// Value `index` of any integer type.
int64_t NumberAt(const ExifValue& value, uint64_t index) {
  switch (value.type) {
    case kExifShort: return value.bytes.U16(2 * index);
    case kExifSShort: return static_cast<int16_t>(value.bytes.U16(2 * index));
    case kExifLong: return value.bytes.U32(4 * index);
    case kExifSLong: return static_cast<int32_t>(value.bytes.U32(4 * index));
    case kExifSByte: return static_cast<int8_t>(value.bytes.U8(index));
    default: return value.bytes.U8(index);
  }
}

// A rational with three decimals, identical to "%.3f" of the quotient as a double, but in integers,
// which is much faster. Only exact ties can differ and are left to the slow way.
void AddThousandths(std::string& buffer, const Rational& rational) {
  const auto numerator = static_cast<uint64_t>(rational.numerator) * 1000;
  const auto denominator = static_cast<uint64_t>(rational.denominator);
  if (rational.numerator < 0 || rational.denominator <= 0 ||
      numerator % denominator * 2 == denominator) {
    return AddFixed(buffer, rational.Value(), 3);
  }
  const uint64_t thousandths = (numerator + denominator / 2) / denominator;
  const uint64_t decimals = thousandths % 1000;
  AddNumber(buffer, static_cast<int64_t>(thousandths / 1000));
  const char digits[] = {'.', static_cast<char>('0' + decimals / 100),
                         static_cast<char>('0' + decimals / 10 % 10),
                         static_cast<char>('0' + decimals % 10)};
  buffer.append(digits, sizeof digits);
}

void AddValue(std::string& buffer, const ExifValue& value, uint64_t index) {
  if (value.type == kExifRational || value.type == kExifSRational) {
    AddThousandths(buffer, RationalAt(value, index));
  } else {
    AddNumber(buffer, NumberAt(value, index));
  }
}

bool IsNumber(const ExifValue& value) {
  return value.type == kExifByte || value.type == kExifShort || value.type == kExifLong;
}
bool IsRational(const ExifValue& value) { return value.type == kExifRational; }
bool IsOpaque(const ExifValue& value) { return value.type == kExifUndefined; }

// --- texts by type ---

std::string_view Characters(const ExifValue& value) {
  const auto bytes = value.bytes.Part(0, std::min(value.count, limits.exifValueCharacters));
  const auto end = std::find(bytes.begin(), bytes.end(), uint8_t{0});
  return {reinterpret_cast<const char*>(bytes.data()), static_cast<size_t>(end - bytes.begin())};
}

Text JoinedNumbers(const ExifValue& value, std::string& buffer) {
  const uint32_t shown = std::min(value.count, kMostNumbers);
  for (uint32_t i = 0; i < shown; ++i) {
    if (i > 0) buffer += ' ';
    AddValue(buffer, value, i);
  }
  if (shown < value.count) buffer += " ...";
  return buffer;
}

Text PlainText(const ExifValue& value, const ExifTag* row, std::string& buffer) {
  if (value.type == kExifAscii) return Characters(value);
  if (value.type < kExifByte || value.type > kExifSRational || value.count == 0) return {};
  if (IsOpaque(value) && row != nullptr && row->editClass == kExifOpaque) return {};
  return JoinedNumbers(value, buffer);
}

// --- texts by rule; none if the value's type or count does not fit the rule ---

int64_t WordIndex(const ExifWordList& list, int64_t number) {
  if (list.codes.empty()) return number;
  const auto found = std::find(list.codes.begin(), list.codes.end(), number);
  return found == list.codes.end() ? list.otherwise : found - list.codes.begin();
}

Text WordText(const ExifValue& value, const ExifWordList& list) {
  const bool fits = list.key == ExifWordKey::Letter
                        ? value.type == kExifAscii
                        : IsNumber(value) || (list.key == ExifWordKey::Opaque && IsOpaque(value));
  if (!fits || value.count == 0) return {};
  return ListItem(list.words, WordIndex(list, NumberAt(value, 0)));
}

Text ComponentsText(const ExifValue& value, const ExifWordList& list, std::string& buffer) {
  if ((!IsOpaque(value) && value.type != kExifByte) || value.count == 0) return {};
  for (uint64_t i = 0; i < 4; ++i) buffer += ListItem(list.words, value.bytes.U8(i));
  return buffer;
}

Text GpsVersionText(const ExifValue& value, std::string& buffer) {
  if ((!IsOpaque(value) && value.type != kExifByte) || value.count != 4) return {};
  for (uint64_t i = 0; i < 4; ++i) {
    if (i > 0) buffer += '.';
    AddNumber(buffer, value.bytes.U8(i));
  }
  return buffer;
}

Text VersionText(const ExifValue& value) {
  if ((!IsOpaque(value) && value.type != kExifByte) || value.count == 0) return {};
  return Characters(value);
}

Text FlashText(const ExifValue& value, std::string& buffer) {
  if (!IsNumber(value) || value.count == 0) return {};
  struct Field {
    std::string_view title, words;
    int shift, mask;
  };
  static constexpr Field kFields[] = {
      {"Fire: ", "N;Y", 0, 1},      {" Return: ", "X;U;N;D", 1, 3}, {" Mode: ", "U;F;S;A", 3, 3},
      {" Function: ", "P;N", 5, 1}, {" Redeye: ", "N;Y", 6, 1},
  };
  const int64_t bits = NumberAt(value, 0);
  for (const Field& field : kFields) {
    buffer += field.title;
    buffer += ListItem(field.words, bits >> field.shift & field.mask);
  }
  return buffer;
}

// A word, then each value after its letter: "Circular area X: 10 Y: 20 R: 5".
Text LetteredText(const ExifValue& value, std::string_view word, std::string_view letters,
                  std::string& buffer) {
  buffer += word;
  for (size_t i = 0; i < letters.size(); ++i) {
    if (!buffer.empty()) buffer += ' ';
    buffer += letters[i];
    buffer += ": ";
    AddValue(buffer, value, i);
  }
  return buffer;
}

Text SubjectAreaText(const ExifValue& value, std::string& buffer) {
  if (!IsNumber(value)) return {};
  if (value.count == 2) return LetteredText(value, "By coordinates", "XY", buffer);
  if (value.count == 3) return LetteredText(value, "Circular area", "XYR", buffer);
  if (value.count == 4) return LetteredText(value, "Rectangular area", "XYWH", buffer);
  return {};
}

Text SubjectLocationText(const ExifValue& value, std::string& buffer) {
  if (!IsNumber(value) || value.count != 2) return {};
  return LetteredText(value, "", "XY", buffer);
}

Text LensText(const ExifValue& value, std::string& buffer) {
  static constexpr std::string_view kTitles[] = {
      "Focal length minimum: ", "Focal length maximum: ", "F-stop minimum: ", "F-stop maximum: "};
  if (!IsRational(value) || value.count < std::size(kTitles)) return {};
  for (size_t i = 0; i < std::size(kTitles); ++i) {
    const Rational rational = RationalAt(value, i);
    if (rational.denominator == 0) continue;
    buffer += kTitles[i];
    AddFixed(buffer, rational.Value(), 1);
    buffer += ' ';
  }
  return buffer;
}

// Integer division, so the three decimals are always zeros.
Text DistanceText(const ExifValue& value, std::string& buffer) {
  if (!IsRational(value) || value.count == 0) return {};
  const Rational rational = RationalAt(value, 0);
  if (rational.numerator == 0xffffffff) return "Infinity";
  if (rational.numerator == 0) return "Unknown";
  AddNumber(buffer, rational.denominator == 0 ? 0 : rational.numerator / rational.denominator);
  buffer += ".000";
  return buffer;
}

Text GpsTimeText(const ExifValue& value, std::string& buffer) {
  if (!IsRational(value) || value.count < 3) return {};
  for (uint64_t i = 0; i < 3; ++i) {
    const Rational rational = RationalAt(value, i);
    if (i > 0) buffer += ':';
    AddTwoDigits(buffer, rational.denominator == 0
                             ? 0
                             : static_cast<uint32_t>(rational.numerator / rational.denominator));
  }
  return buffer;
}

// Comments with an unknown code are not listed.
Text CommentText(const ExifValue& value) {
  std::string_view text;
  if (!DecodeUserComment(value.bytes.Part(0, value.count), value.count, limits.exifValueCharacters,
                         text))
    return {};
  return text;
}

Text RuleText(const ExifValue& value, const ExifTag& row, std::string& buffer) {
  switch (row.rule) {
    case ExifRule::Words: return WordText(value, *row.words);
    case ExifRule::Components: return ComponentsText(value, *row.words, buffer);
    case ExifRule::GpsVersion: return GpsVersionText(value, buffer);
    case ExifRule::Version: return VersionText(value);
    case ExifRule::Flash: return FlashText(value, buffer);
    case ExifRule::SubjectArea: return SubjectAreaText(value, buffer);
    case ExifRule::SubjectLocation: return SubjectLocationText(value, buffer);
    case ExifRule::Lens: return LensText(value, buffer);
    case ExifRule::Distance: return DistanceText(value, buffer);
    case ExifRule::GpsTime: return GpsTimeText(value, buffer);
    case ExifRule::Plain:
    case ExifRule::Comment: break;
  }
  return {};
}

}  // namespace

ExifValue ReadExifValue(std::span<const uint8_t> block, const ExifBytes& numbers,
                        const ExifField& field) {
  ExifValue value{field.tag, field.type, field.count, {}};
  uint64_t offset = field.valueOffset, size = field.ValueSize();
  if (field.type == kExifShort && field.count == 0) {
    value.count = 1;
    size = 2;
    if (numbers.BigEndian()) offset += 2;
  }
  const auto there = offset < block.size() ? block.subspan(offset) : std::span<const uint8_t>{};
  value.bytes = ExifBytes(there.first(std::min<uint64_t>(size, there.size())), numbers.BigEndian());
  return value;
}

Text ExifValueText(const ExifValue& value, const ExifTag* row, std::string& buffer) {
  buffer.clear();
  if (row != nullptr && row->rule != ExifRule::Plain) {
    if (row->rule == ExifRule::Comment && IsOpaque(value)) return CommentText(value);
    if (const Text text = RuleText(value, *row, buffer)) return text;
  }
  return PlainText(value, row, buffer);
}

bool DecodeUserComment(std::span<const uint8_t> data, uint32_t count, size_t most,
                       std::string_view& text) {
  text = {};
  if (data.size() < kCodeSize || count < kCodeSize) return false;
  const std::string_view all(reinterpret_cast<const char*>(data.data()), data.size());
  const std::string_view code = all.substr(0, kCodeSize);
  if (code.starts_with("ASCII")) {
    text = all.substr(kCodeSize, std::min<uint64_t>(count - kCodeSize, most));
    text = text.substr(0, text.find('\0'));
    return true;
  }
  if (code == kJisCode) text = "JIS X208-1990 (not supported)";
  if (code.starts_with("UNICODE")) text = "Unicode (not supported)";
  return !text.empty();
}

bool CopyExifValue(const ExifValue& value, ExifRawValue& copy) {
  copy = ExifRawValue{value.bytes.BigEndian(), value.tag, value.type, value.count, {}};
  const auto bytes = value.bytes.Part(0, value.bytes.Size());
  const uint64_t width = value.type == kExifShort ? 2 : 1, size = ExifTypeSize(value.type);
  if (bytes.empty()) return true;
  if (!copy.data.Allocate((bytes.size() + size - 1) / size * size * width)) return false;
  if (width == 1) {
    std::memcpy(copy.data.Data(), bytes.data(), bytes.size());
  } else {
    for (size_t i = 0; i < bytes.size(); ++i) copy.data.Data()[i / 2 * 4 + i % 2] = bytes[i];
  }
  return true;
}

void NormalizeExifValue(ExifRawValue& copy) {
  if (!copy.bigEndian) return;
  copy.bigEndian = false;
  const bool isShort = copy.type == kExifShort;
  const uint32_t size = ExifTypeSize(copy.type);
  if (!isShort && size < 4) return;
  for (uint64_t offset = 0; offset + 4 <= copy.data.Size(); offset += 4) {
    uint8_t* word = copy.data.Data() + offset;
    if (isShort) {
      std::swap(word[0], word[1]);  // the upper half of the swapped slot, moved down
      word[2] = word[3] = 0;
    } else {
      std::reverse(word, word + 4);
    }
  }
}

}  // namespace fotomill
