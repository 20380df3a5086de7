#pragma once

#include <cstdint>
#include <string>
#include <string_view>

#include "settings/key_table.h"
#include "texts/texts.h"

namespace fotomill {

// Why a value is invalid.
enum class ValueFault {
  None,
  NotNumber,   // neither a 32-bit integer nor a word accepted by the key
  NotFlag,     // neither 0 nor 1
  NotColor,    // not a number of 24 bits
  NotChoice,   // not in the choice list
  OutOfRange,  // outside the key's limits
  TooLong,     // longer than the key's limit
  NotText,     // contains a line break or NUL
  NotName,     // part of a file name, but contains a path
  Internal,    // set by the program only
};

// The source of a value. Faults in what a person enters are reported; a file's values are used
// as far as possible.
enum class ValueSource { Person, File };

// A parsed value and its fault, if any.
struct SettingValue {
  ValueFault fault = ValueFault::None;
  bool usable = true;     // false: the key keeps its current value
  int32_t number = 0;     // keys without KEY_TEXT
  std::string_view text;  // keys with KEY_TEXT; a view into the input
};

// Parses a value from the configuration file or the command line; blanks are significant. Numbers
// are decimal; a person may also write 0x. A color may be #RRGGBB, #RGB or a CSS name, a flag yes,
// no, true, false, on or off. Invalid values are not usable, with one exception: a limited text
// from a file is cut to its limit.
SettingValue ReadValue(const KeyRow& row, std::string_view value, ValueSource source);

// Stores a usable value.
void StoreValue(const KeyRow& row, const SettingValue& value);
// Whether the key has that value now.
bool HoldsValue(const KeyRow& row, const SettingValue& value);

// The current value, or the default, in configuration file syntax.
std::string ValueText(const KeyRow& row);
std::string DefaultValueText(const KeyRow& row);  // in configuration file syntax

// As above, for display: a color as #RRGGBB.
std::string ReadableValue(const KeyRow& row);
std::string ReadableDefault(const KeyRow& row);  // as above

// The valid values, for display: "a number from 0 to 9".
RecordedText ValuesText(const KeyRow& row);
// As a sentence: "PngCompression takes a number from 0 to 9." Empty without a fault.
std::string FaultMessage(const KeyRow& row, ValueFault fault);

}  // namespace fotomill
