#include "settings/setting_value.h"

#include <charconv>
#include <optional>

#include "core/plain_name.h"
#include "core/utf8.h"
#include "core/whole_number.h"
#include "settings/spin_range.h"
#include "texts/texts.h"

namespace fotomill {

namespace {

constexpr int32_t kMostColor = 0xFFFFFF;

// Decimal, or "0x" and hexadecimal digits where a person writes.
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
  if ((row.type & KEY_SPIN) != 0) {
    const SpinRange range = SpinRangeOf(row);
    return number >= range.minimum && number <= range.maximum ? ValueFault::None
                                                              : ValueFault::OutOfRange;
  }
  return ValueFault::None;
}

SettingValue ReadNumberValue(const KeyRow& row, std::string_view text, ValueSource source) {
  SettingValue value;
  const std::optional<int32_t> number = ReadNumber(text, source);
  if (!number) {
    value.fault = (row.type & KEY_FLAG) != 0 ? ValueFault::NotFlag : ValueFault::NotNumber;
    value.usable = false;
    return value;
  }
  value.number = *number;
  value.fault = NumberFault(row, *number);
  value.usable = value.fault == ValueFault::None ||
                 (source == ValueSource::File && value.fault != ValueFault::NotColor);
  if (value.fault == ValueFault::NotFlag) value.number = 1;
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

std::string ListText(const KeyRow& row) {
  std::string text;
  int32_t position = 0;
  for (const ChoiceEntry* entry = row.extra.choices; entry->text != nullptr; ++entry, ++position) {
    const int32_t number = (row.type & KEY_BY_VALUE) != 0 ? entry->value : position;
    text += (position == 0 ? "" : ", ") + std::to_string(number) + " (" + Tr(entry->text) + ")";
  }
  return text;
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

std::string FaultMessage(const KeyRow& row, ValueFault fault) {
  switch (fault) {
    case ValueFault::None: return {};
    case ValueFault::NotNumber: return Tr("%1 takes a whole number.", row.name);
    case ValueFault::NotFlag:
      return IsLooseFlag(row) ? Tr("%1 takes a whole number.", row.name)
                              : Tr("%1 takes 0 or 1.", row.name);
    case ValueFault::NotColor:
      return Tr("%1 takes a color: blue * 65536 + green * 256 + red, or 0xBBGGRR.", row.name);
    case ValueFault::NotChoice: return Tr("%1 takes %2.", row.name, ListText(row));
    case ValueFault::OutOfRange: {
      const SpinRange range = SpinRangeOf(row);
      return Tr("%1 takes a number from %2 to %3.", row.name, range.minimum, range.maximum);
    }
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
