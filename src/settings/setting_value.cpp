#include "settings/setting_value.h"

#include <charconv>
#include <cstdio>
#include <iterator>
#include <optional>

#include "core/plain_name.h"
#include "core/text.h"
#include "core/utf8.h"
#include "core/whole_number.h"
#include "operations/parameter.h"
#include "settings/spin_range.h"
#include "texts/texts.h"

namespace fotomill {

namespace {

constexpr int32_t kMostColor = 0xFFFFFF;

// Decimal; from a person also "0x" and hex digits.
std::optional<int32_t> ReadNumber(std::string_view value, ValueSource source) {
  if (source == ValueSource::Person && (value.starts_with("0x") || value.starts_with("0X"))) {
    value.remove_prefix(2);
    int32_t number = 0;
    const auto [end, error] =
        std::from_chars(value.data(), value.data() + value.size(), number, 16);
    if (error != std::errc() || end != value.data() + value.size() || value.starts_with('-'))
      return std::nullopt;
    return number;
  }
  return ParseNumber(value);
}

// "#RRGGBB", "#RGB" or a CSS name, as the stored number; no transparent colors.
std::optional<int32_t> ReadColorText(std::string_view text) {
  AlphaColor color;
  if (!ReadColor(text, color) || color.alpha != 255) return std::nullopt;
  return color.red | color.green << 8 | color.blue << 16;
}

std::optional<int32_t> ReadFlagWord(std::string_view text) {
  constexpr std::string_view kWords[] = {"no", "yes", "false", "true", "off", "on"};
  for (size_t i = 0; i < std::size(kWords); ++i) {
    if (EqualIgnoringCase(text, kWords[i])) return static_cast<int32_t>(i % 2);
  }
  return std::nullopt;
}

// Alternative spellings of a value for this kind of key.
std::optional<int32_t> ReadWord(const KeyRow& row, std::string_view text) {
  if ((row.type & KEY_COLOR) != 0) return ReadColorText(text);
  if ((row.type & KEY_FLAG) != 0 && !IsLooseFlag(row)) return ReadFlagWord(text);
  return std::nullopt;
}

bool IsInList(const KeyRow& row, int32_t number) {
  int32_t position = 0;
  for (const ChoiceEntry* entry = row.extra.choices; entry->text != nullptr; ++entry, ++position) {
    if (number == ((row.type & KEY_BY_VALUE) != 0 ? entry->value : position)) return true;
  }
  return number == DefaultNumber(row);
}

ValueFault NumberFault(const KeyRow& row, int32_t number) {
  if ((row.type & KEY_FLAG) != 0)
    return IsLooseFlag(row) || number == 0 || number == 1 ? ValueFault::None : ValueFault::NotFlag;
  if ((row.type & KEY_COLOR) != 0)
    return number >= 0 && number <= kMostColor ? ValueFault::None : ValueFault::NotColor;
  if ((row.type & KEY_CHOICE) != 0)
    return IsInList(row, number) ? ValueFault::None : ValueFault::NotChoice;
  const std::optional<SpinRange> range = LimitsOf(row);
  const bool outside = range && (number < range->minimum || number > range->maximum);
  return outside ? ValueFault::OutOfRange : ValueFault::None;
}

SettingValue ReadNumberValue(const KeyRow& row, std::string_view text, ValueSource source) {
  SettingValue value;
  const std::optional<int32_t> word = ReadWord(row, text);
  const std::optional<int32_t> number = word ? word : ReadNumber(text, source);
  value.fault = number ? NumberFault(row, *number) : ValueFault::NotNumber;
  value.usable = value.fault == ValueFault::None;
  value.number = number.value_or(0);
  return value;
}

SettingValue ReadTextValue(const KeyRow& row, std::string_view text, ValueSource source) {
  SettingValue value;
  value.text = text;
  if (text.size() > TextLimit(row)) {
    value.fault = ValueFault::TooLong;
    value.usable = source == ValueSource::File && (row.type & KEY_TEXT_LIMIT) != 0;
    value.text = CutText(text, TextLimit(row));
  }
  if (text.find_first_of(std::string_view("\r\n\0", 3)) != std::string_view::npos) {
    value.fault = ValueFault::NotText;
    value.usable = false;
  } else if (HoldsName(row) && !IsPlainName(value.text)) {
    value.fault = ValueFault::NotName;
    value.usable = false;
  }
  return value;
}

RecordedText ListText(const KeyRow& row) {
  RecordedText list;
  int32_t position = 0;
  for (const ChoiceEntry* entry = row.extra.choices; entry->text != nullptr; ++entry, ++position) {
    const int32_t number = (row.type & KEY_BY_VALUE) != 0 ? entry->value : position;
    const std::string before = (position == 0 ? "" : ", ") + std::to_string(number) + " (";
    list.english += before + entry->text + ")";
    list.shown += before + Tr(entry->text) + ")";
  }
  return list;
}

std::string ColorText(int32_t number) {
  const auto color = static_cast<uint32_t>(number);
  char text[16];
  std::snprintf(text, sizeof text, "#%02X%02X%02X", color & 0xFF, color >> 8 & 0xFF,
                color >> 16 & 0xFF);
  return text;
}

RecordedText NumberValues(const KeyRow& row) {
  if ((row.type & KEY_FLAG) != 0 && !IsLooseFlag(row)) return TrRecorded("yes or no (1 or 0)");
  if ((row.type & KEY_COLOR) != 0) {
    return TrRecorded(
        "a color: #RRGGBB, a name such as orange, or the number blue * 65536 + green * 256 + red");
  }
  if ((row.type & KEY_CHOICE) != 0) return ListText(row);
  const std::optional<SpinRange> range = LimitsOf(row);
  if (!range) return TrRecorded("a whole number");
  if (range->maximum == INT32_MAX) return TrRecorded("a number of at least %1", range->minimum);
  return TrRecorded("a number from %1 to %2", range->minimum, range->maximum);
}

}  // namespace

SettingValue ReadValue(const KeyRow& row, std::string_view value, ValueSource source) {
  if ((row.type & KEY_INTERNAL) != 0) {
    SettingValue internal;
    internal.fault = ValueFault::Internal;
    internal.usable = false;
    return internal;
  }
  return (row.type & KEY_TEXT) != 0 ? ReadTextValue(row, value, source)
                                    : ReadNumberValue(row, value, source);
}

void StoreValue(const KeyRow& row, const SettingValue& value) {
  if ((row.type & KEY_TEXT) != 0) {
    StoreText(row, value.text);
  } else {
    StoreNumber(row, value.number);
  }
}

bool HoldsValue(const KeyRow& row, const SettingValue& value) {
  return (row.type & KEY_TEXT) != 0 ? TextIn(row) == value.text : NumberIn(row) == value.number;
}

std::string ValueText(const KeyRow& row) {
  return (row.type & KEY_TEXT) != 0 ? std::string(TextIn(row)) : std::to_string(NumberIn(row));
}

std::string DefaultValueText(const KeyRow& row) {
  return (row.type & KEY_TEXT) != 0 ? std::string(DefaultText(row))
                                    : std::to_string(DefaultNumber(row));
}

RecordedText ValuesText(const KeyRow& row) {
  if ((row.type & KEY_INTERNAL) != 0) return TrRecorded("nothing; the program sets it");
  if ((row.type & KEY_TEXT) == 0) return NumberValues(row);
  if ((row.type & KEY_DESTINATION) != 0)
    return TrRecorded("the extension of a format that can be written");
  if (HoldsName(row))
    return TrRecorded("part of a file name, at most %1 characters", TextLimit(row));
  return TrRecorded("a text of at most %1 characters", TextLimit(row));
}

std::string ReadableValue(const KeyRow& row) {
  return (row.type & KEY_COLOR) != 0 ? ColorText(NumberIn(row)) : ValueText(row);
}

std::string ReadableDefault(const KeyRow& row) {
  return (row.type & KEY_COLOR) != 0 ? ColorText(DefaultNumber(row)) : DefaultValueText(row);
}

std::string FaultMessage(const KeyRow& row, ValueFault fault) {
  switch (fault) {
    case ValueFault::None: return {};
    case ValueFault::NotNumber:
    case ValueFault::NotFlag:
    case ValueFault::NotColor:
    case ValueFault::NotChoice:
    case ValueFault::OutOfRange: return Tr("%1 takes %2.", row.name, ValuesText(row).shown);
    case ValueFault::TooLong:
      return Tr("%1 takes at most %2 characters.", row.name, TextLimit(row));
    case ValueFault::NotText: return Tr("%1 takes no line breaks and no NUL bytes.", row.name);
    case ValueFault::NotName:
      return Tr(
          "Invalid destination. %1 takes a name, not a path: no \"/\", \"\\\", \"..\" or control "
          "characters.",
          row.name);
    case ValueFault::Internal: return Tr("%1 is an internal value and cannot be set.", row.name);
  }
  return {};
}

}  // namespace fotomill
