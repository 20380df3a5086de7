// Source: CIPA DC-008-2012, sections 4.6.4 to 4.6.6.
#include "metadata/edit/exif_input.h"

#include <algorithm>
#include <cctype>
#include <charconv>
#include <cmath>
#include <optional>
#include <vector>

#include "core/limits.h"
#include "core/text.h"
#include "core/utf8.h"
#include "metadata/edit/exif_dates.h"
#include "metadata/exif/exif_tags.h"
#include "texts/texts.h"

namespace fotomill {

namespace {

// Tags with special handling.
constexpr uint16_t kOrientation = 0x0112, kGpsTime = 0x0007, kGpsDate = 0x001d,
                   kDistanceReference = 0x0019, kUserComment = 0x9286;
constexpr uint16_t kLatitudes[] = {0x0002, 0x0014}, kLongitudes[] = {0x0004, 0x0016};
constexpr uint16_t kTimes[] = {0x0132, 0x9003, 0x9004}, kSubseconds[] = {0x9290, 0x9291, 0x9292};

bool IsAnyOf(uint16_t tag, std::span<const uint16_t> tags) {
  return std::ranges::find(tags, tag) != tags.end();
}

void Put(std::vector<uint8_t>& bytes, uint64_t number, size_t size) {
  for (size_t i = 0; i < size; ++i) bytes.push_back(static_cast<uint8_t>(number >> 8 * i));
}

// Little-endian, with a byte order mark.
void PutUtf16(std::string_view text, std::vector<uint8_t>& bytes) {
  Put(bytes, 0xFEFF, 2);
  while (!text.empty()) {
    const char32_t character = NextCharacter(text, U'\uFFFD');
    if (character < 0x10000) {
      Put(bytes, character, 2);
    } else {
      Put(bytes, 0xD800 + ((character - 0x10000) >> 10), 2);
      Put(bytes, 0xDC00 + ((character - 0x10000) & 0x3FF), 2);
    }
  }
}

// A number as entered, unrounded.
struct Fraction {
  int64_t numerator = 0, denominator = 1;
  double Value() const { return static_cast<double>(numerator) / static_cast<double>(denominator); }
};

// Parses a decimal number or two integers with a slash, and removes it from `text`.
std::optional<Fraction> TakeFraction(std::string_view& text) {
  constexpr int64_t kMost = int64_t{1} << 53;
  const bool negative = text.starts_with('-');
  if (negative || text.starts_with('+')) text.remove_prefix(1);
  Fraction fraction;
  bool digits = false, point = false;
  for (; !text.empty(); text.remove_prefix(1)) {
    if (text[0] == '.' && !point) {
      point = true;
      continue;
    }
    if (!IsDigit(text[0])) break;
    digits = true;
    if (fraction.numerator > kMost / 10 || fraction.denominator > kMost / 10) {
      if (!point) return {};
      continue;  // beyond the precision
    }
    fraction.numerator = fraction.numerator * 10 + (text[0] - '0');
    if (point) fraction.denominator *= 10;
  }
  if (!digits) return {};
  if (negative) fraction.numerator = -fraction.numerator;
  if (!point && text.starts_with('/') && text.size() > 1 && IsDigit(text[1])) {
    text.remove_prefix(1);
    const auto [end, error] =
        std::from_chars(text.data(), text.data() + text.size(), fraction.denominator);
    if (error != std::errc{}) return {};
    text.remove_prefix(static_cast<size_t>(end - text.data()));
  }
  return fraction;
}

// All numbers in a text, skipping separators and, with `labels`, labels such as "X:". Empty for any
// other text.
std::vector<Fraction> Numbers(std::string_view text, bool labels) {
  std::vector<Fraction> numbers;
  while (!text.empty()) {
    const char c = text[0];
    if (c == ' ' || c == ',' || c == ':' || c == '\t') {
      text.remove_prefix(1);
    } else if (labels && std::isalpha(static_cast<unsigned char>(c)) != 0) {
      const size_t end = text.find_first_of("0123456789:");
      text.remove_prefix(std::min(end, text.size()));
    } else if (const auto number = TakeFraction(text)) {
      numbers.push_back(*number);
      if (!text.empty() && std::string_view(" ,:\t").find(text[0]) == std::string_view::npos)
        return {};
    } else {
      return {};
    }
  }
  return numbers;
}

// Rounds a number to fit a RATIONAL or SRATIONAL; false if out of range.
bool FitRational(Fraction& fraction, bool isSigned) {
  const int64_t least = isSigned ? INT32_MIN : 0, most = isSigned ? INT32_MAX : UINT32_MAX;
  const auto fits = [&] {
    return fraction.numerator >= least && fraction.numerator <= most &&
           fraction.denominator <= most;
  };
  while (!fits() && fraction.denominator >= 10 && fraction.denominator % 10 == 0) {
    fraction.numerator = (fraction.numerator + (fraction.numerator < 0 ? -5 : 5)) / 10;
    fraction.denominator /= 10;
  }
  return fits();
}

struct CountRange {
  size_t least, most;
};
CountRange CountsOf(const ExifTag& row) {
  if (IsAnyOf(row.tag, kLatitudes) || IsAnyOf(row.tag, kLongitudes) || row.tag == kGpsTime)
    return {3, 3};
  switch (row.rule) {
    case ExifRule::Lens: return {4, 4};
    case ExifRule::SubjectArea: return {2, 4};
    case ExifRule::SubjectLocation: return {2, 2};
    default: return {1, 1};
  }
}

struct CodedWord {
  std::string_view word;
  int32_t code;
};

// The items of a tag's word list that can be set, with their codes.
std::vector<CodedWord> CodedWords(const ExifTag& row) {
  // the word list has directions here, but the standard has units
  if (row.tag == kDistanceReference) return {{"K", 'K'}, {"M", 'M'}, {"N", 'N'}};
  const ExifWordList& list = *row.words;
  const auto items = static_cast<int32_t>(std::ranges::count(list.words, ';')) + 1;
  std::vector<CodedWord> words;
  for (int32_t i = 0; i < items; ++i) {
    const int32_t code = list.codes.empty() ? i
                         : static_cast<size_t>(i) < list.codes.size()
                             ? list.codes[static_cast<size_t>(i)]
                             : -1;
    if (code >= 0 && !(row.tag == kOrientation && code == 0))
      words.push_back({ListItem(list.words, i), code});
  }
  return words;
}

class Input {
 public:
  Input(const ExifTag& row, std::string_view text, ExifEntry& entry, std::string& reason)
      : row_(row), text_(text), entry_(entry), reason_(reason) {}

  bool Parse() {
    entry_ = {row_.tag, row_.type, 0, {}};
    if (text_.empty()) return Refuse(Tr("It has no value; exif unset removes a tag."));
    if (row_.tag == kUserComment) return Comment();
    if (row_.rule == ExifRule::Flash) return Flash();
    if (row_.rule == ExifRule::Version) return Version();
    if (row_.words != nullptr) return Word();
    if (row_.type == kExifAscii) return Text();
    return Values();
  }

 private:
  bool Refuse(std::string reason) {
    reason_ = std::move(reason);
    return false;
  }
  bool NotAllowed(const std::string& allowed) {
    return Refuse(Tr("\"%1\" is not a value of \"%2\": %3", text_, row_.name, allowed));
  }

  void Number(int64_t number) {
    Put(entry_.value, static_cast<uint64_t>(number), ExifTypeSize(entry_.type));
    ++entry_.count;
  }

  bool Characters() {
    if (text_.size() >= limits.exifValueCharacters)
      return Refuse(Tr("The text is longer than %1 characters.", limits.exifValueCharacters - 1));
    if (!IsUtf8(text_)) return Refuse(Tr("The text is not valid UTF-8."));
    const bool controls = std::ranges::any_of(text_, [](char c) {
      return static_cast<unsigned char>(c) < 0x20 && c != '\n' && c != '\r' && c != '\t';
    });
    return !controls || Refuse(Tr("The text has control characters."));
  }

  bool Text() {
    if (!Characters()) return false;
    if (IsAnyOf(row_.tag, kTimes)) {
      const auto time = ParseExifTime(text_);
      if (!time) return NotAllowed(Tr("a date and time such as 2024:05:31 14:03:00."));
      entry_ = ExifTextEntry(row_.tag, ExifTimeText(*time));
      return true;
    }
    if (row_.tag == kGpsDate) {
      const auto time = ParseExifTime(std::string(text_) + " 00:00:00");
      if (!time) return NotAllowed(Tr("a date such as 2024:05:31."));
      entry_ = ExifTextEntry(row_.tag, ExifTimeText(*time).substr(0, 10));
      return true;
    }
    if (IsAnyOf(row_.tag, kSubseconds) && !std::ranges::all_of(text_, IsDigit))
      return NotAllowed(Tr("digits only."));
    entry_ = ExifTextEntry(row_.tag, text_);
    return true;
  }

  // ASCII if possible, else UTF-16.
  bool Comment() {
    if (!Characters()) return false;
    const bool ascii =
        std::ranges::all_of(text_, [](char c) { return static_cast<signed char>(c) > 0; });
    const std::string_view code =
        ascii ? std::string_view("ASCII\0\0\0", 8) : std::string_view("UNICODE\0", 8);
    entry_.value.assign(code.begin(), code.end());
    if (ascii) {
      entry_.value.insert(entry_.value.end(), text_.begin(), text_.end());
    } else {
      PutUtf16(text_, entry_.value);
    }
    entry_.count = static_cast<uint32_t>(entry_.value.size());
    return true;
  }

  bool Version() {
    if (text_.size() != 4 || !std::ranges::all_of(text_, IsDigit))
      return NotAllowed(Tr("four digits."));
    entry_.value.assign(text_.begin(), text_.end());
    entry_.count = 4;
    return true;
  }

  bool Flash() {
    constexpr struct {
      std::string_view label, words;
      int shift;
    } kFields[] = {{"Fire:", "N;Y", 0},
                   {"Return:", "X;U;N;D", 1},
                   {"Mode:", "U;F;S;A", 3},
                   {"Function:", "P;N", 5},
                   {"Redeye:", "N;Y", 6}};
    if (IsDigit(text_[0])) return Values(127);
    int64_t bits = 0;
    std::string_view rest = text_;
    for (const auto& field : kFields) {
      rest.remove_prefix(std::min(rest.find_first_not_of(' '), rest.size()));
      if (!rest.starts_with(field.label)) return FlashRefused();
      rest.remove_prefix(field.label.size());
      rest.remove_prefix(std::min(rest.find_first_not_of(' '), rest.size()));
      const size_t place =
          rest.empty() || rest[0] == ';' ? std::string_view::npos : field.words.find(rest[0]);
      if (place == std::string_view::npos) return FlashRefused();
      bits |= static_cast<int64_t>(place / 2) << field.shift;
      rest.remove_prefix(1);
    }
    if (rest.find_first_not_of(' ') != std::string_view::npos) return FlashRefused();
    Number(bits);
    return true;
  }
  bool FlashRefused() {
    return NotAllowed(Tr("0 to 127, or a text such as \"%1\".",
                         "Fire: Y Return: X Mode: A Function: P Redeye: N"));
  }

  // An item of the tag's word list, or its number or letter.
  bool Word() {
    const bool letters = row_.words->key == ExifWordKey::Letter;
    std::string allowed;
    for (const CodedWord& item : CodedWords(row_)) {
      allowed.append(allowed.empty() ? "" : ", ").append(item.word);
      const std::string number =
          letters ? std::string(1, static_cast<char>(item.code)) : std::to_string(item.code);
      if (EqualIgnoringCase(text_, item.word) || EqualIgnoringCase(text_, number))
        return Code(item.code);
    }
    return NotAllowed(Tr("one of: %1.", allowed));
  }

  bool Code(int32_t code) {
    if (row_.type == kExifAscii) {
      const char letter = static_cast<char>(code);
      entry_ = ExifTextEntry(row_.tag, {&letter, 1});
    } else {
      Number(code);
    }
    return true;
  }

  bool Values(int64_t most = 0) {
    const bool degrees = IsAnyOf(row_.tag, kLatitudes) || IsAnyOf(row_.tag, kLongitudes);
    const bool distance = row_.rule == ExifRule::Distance;
    std::vector<Fraction> numbers;
    if (distance && EqualIgnoringCase(text_, "Infinity")) {
      numbers = {{UINT32_MAX, 1}};
    } else if (distance && EqualIgnoringCase(text_, "Unknown")) {
      numbers = {{0, 1}};
    } else {
      numbers = Numbers(text_, CountsOf(row_).most > 1);
    }
    if (degrees && numbers.size() == 1) numbers = Degrees(numbers[0].Value());
    const CountRange counts = CountsOf(row_);
    if (numbers.size() < counts.least || numbers.size() > counts.most) {
      if (counts.least == counts.most)
        return NotAllowed(TrCount("one number.", "%1 numbers.", counts.most));
      return NotAllowed(Tr("%1 to %2 numbers.", counts.least, counts.most));
    }
    if ((degrees || row_.tag == kGpsTime) && !InRange(numbers))
      return NotAllowed(degrees ? Tr("degrees, minutes and seconds.")
                                : Tr("hours, minutes and seconds."));
    return std::ranges::all_of(numbers, [&](Fraction& number) { return Value(number, most); });
  }

  static std::vector<Fraction> Degrees(double value) {
    constexpr int64_t kParts = 1000000;
    if (value < 0 || value > 360) return {};
    const auto all = static_cast<int64_t>(std::llround(value * 3600 * kParts));
    return {
        {all / (3600 * kParts), 1}, {all / (60 * kParts) % 60, 1}, {all % (60 * kParts), kParts}};
  }

  bool InRange(const std::vector<Fraction>& numbers) const {
    const double most = row_.tag == kGpsTime ? 23 : IsAnyOf(row_.tag, kLatitudes) ? 90 : 180;
    const double first = numbers[0].Value(), second = numbers[1].Value(),
                 third = numbers[2].Value();
    // degrees and minutes may have a fraction if they come last
    return first >= 0 && first <= most && second >= 0 && second < 60 && third >= 0 && third < 60 &&
           (row_.tag == kGpsTime || first + second / 60 + third / 3600 <= most);
  }

  bool Value(Fraction& number, int64_t most) {
    const bool rational = row_.type == kExifRational || row_.type == kExifSRational;
    if (number.denominator <= 0) return NotAllowed(Tr("a number."));
    const double value = number.Value();
    const double scale = rational ? 1000 : 1;
    const bool bounded = row_.minimum != 0 || row_.maximum != 0;
    if (bounded && (value * scale < row_.minimum || value * scale > row_.maximum))
      return NotAllowed(Tr("%1 to %2.", Bound(row_.minimum / scale), Bound(row_.maximum / scale)));
    if (rational) {
      if (!FitRational(number, row_.type == kExifSRational))
        return NotAllowed(Tr("a smaller number."));
      Put(entry_.value, static_cast<uint64_t>(number.numerator), 4);
      Put(entry_.value, static_cast<uint64_t>(number.denominator), 4);
      ++entry_.count;
      return true;
    }
    const int64_t greatest = most != 0                ? most
                             : row_.type == kExifLong ? int64_t{UINT32_MAX}
                             : row_.type == kExifByte ? 255
                                                      : 65535;
    if (number.numerator % number.denominator != 0 || value < 0 ||
        value > static_cast<double>(greatest))
      return NotAllowed(Tr("a whole number from 0 to %1.", greatest));
    Number(number.numerator / number.denominator);
    return true;
  }

  static std::string Bound(double bound) {
    char digits[32];
    const auto end = std::to_chars(digits, digits + sizeof digits, bound).ptr;
    return {digits, end};
  }

  const ExifTag& row_;
  const std::string_view text_;
  ExifEntry& entry_;
  std::string& reason_;
};

}  // namespace

std::vector<std::string_view> ExifInputWords(uint16_t tag) {
  std::vector<std::string_view> words;
  const ExifTag* row = FindExifTag(tag);
  if (row == nullptr || row->rule != ExifRule::Words) return words;
  for (const CodedWord& item : CodedWords(*row)) words.push_back(item.word);
  return words;
}

ExifPlace PlaceOfExifTag(uint16_t tag) {
  constexpr uint16_t kLastGpsTag = 0x001f;
  constexpr struct {
    uint16_t first, last;
  } kExifTags[] = {
      {0x829a, 0x829d}, {0x8822, 0x8824}, {0x8827, 0x8835}, {0x9000, 0x9bff}, {0xa000, 0xbbff}};
  if (tag <= kLastGpsTag) return ExifPlace::Gps;
  for (const auto& range : kExifTags) {
    if (tag >= range.first && tag <= range.last) return ExifPlace::Exif;
  }
  return ExifPlace::First;
}

ExifEntry ExifTextEntry(uint16_t tag, std::string_view text) {
  ExifEntry entry{
      tag, kExifAscii, static_cast<uint32_t>(text.size() + 1), {text.begin(), text.end()}};
  entry.value.push_back(0);
  return entry;
}

ExifEntry ExifRationalEntry(uint16_t tag, std::initializer_list<ExifFraction> values) {
  ExifEntry entry{tag, kExifRational, static_cast<uint32_t>(values.size()), {}};
  for (const ExifFraction& value : values) {
    Put(entry.value, value.numerator, 4);
    Put(entry.value, value.denominator, 4);
  }
  return entry;
}

bool ParseExifInput(uint16_t tag, std::string_view text, ExifEntry& entry, std::string& reason) {
  const ExifTag* row = FindExifTag(tag);
  if (row == nullptr) {
    reason = Tr("The type of this tag is not known, so it cannot be set.");
    return false;
  }
  if (row->editClass != kExifOrdinary) {
    reason = Tr("\"%1\" describes the structure of the file and cannot be changed.", row->name);
    return false;
  }
  return Input(*row, text, entry, reason).Parse();
}

}  // namespace fotomill
