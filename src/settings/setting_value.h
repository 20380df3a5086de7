#pragma once

#include <cstdint>
#include <string>
#include <string_view>

#include "settings/key_table.h"
#include "texts/texts.h"

namespace fotomill {

// What is wrong with a value.
enum class ValueFault {
  None,
  NotNumber,   // neither a whole number of 32 bits nor a word that the key takes
  NotFlag,     // neither 0 nor 1
  NotColor,    // not a number of 24 bits
  NotChoice,   // not in the choice list
  OutOfRange,  // outside the key's limits
  TooLong,     // longer than the key's limit
  NotText,     // holds a line break or a zero byte
  NotName,     // part of a file name that leads elsewhere
  Internal,    // the program's own value
};

// Where a value comes from. A person is told about every fault. A file is not: what can be used of
// it is.
enum class ValueSource { Person, File };

// A value that was read, and what is wrong with it.
struct SettingValue {
  ValueFault fault = ValueFault::None;
  bool usable = true;     // false: the key keeps the value that it has
  int32_t number = 0;     // keys without KEY_TEXT
  std::string_view text;  // keys with it; a view into what was read
};

// Reads a value as it is in the configuration file or on a command line, whole and with its blanks.
// Numbers are decimal; a person may write 0x. A color may also be #RRGGBB, #RGB or a CSS name, a
// flag yes, no, true, false, on or off. What a key does not take is not usable, with one exception:
// a text with a limit that comes from a file is cut to it.
SettingValue ReadValue(const KeyRow& row, std::string_view value, ValueSource source);

// Stores a value that is usable.
void StoreValue(const KeyRow& row, const SettingValue& value);
// Whether the key holds that value now.
bool HoldsValue(const KeyRow& row, const SettingValue& value);

// The value in force, or the default, as the configuration file holds it.
std::string ValueText(const KeyRow& row);
std::string DefaultValueText(const KeyRow& row);  // as the file would say it

// The same for people: a color as #RRGGBB.
std::string ReadableValue(const KeyRow& row);
std::string ReadableDefault(const KeyRow& row);  // likewise

// What the key takes, for people: "a number from 0 to 9".
RecordedText ValuesText(const KeyRow& row);
// As a whole sentence: "PngCompression takes a number from 0 to 9." Empty without a fault.
std::string FaultMessage(const KeyRow& row, ValueFault fault);

}  // namespace fotomill
