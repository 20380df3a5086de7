#pragma once

#include <cstdint>
#include <string>
#include <string_view>

#include "settings/key_table.h"

namespace fotomill {

// What is wrong with a value.
enum class ValueFault {
  None,
  NotNumber,   // not a whole number of 32 bits
  NotFlag,     // neither 0 nor 1
  NotColor,   // not a number of 24 bits
  NotChoice,   // not in the choice list
  OutOfRange,  // outside the spin control's range
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
// Numbers are decimal; a person may write 0x. From a file a flag is 1 for any number but 0, a text
// with a limit is cut to it, and numbers outside their list or range stay, since whoever acts on
// them must be ready for them anyway.
SettingValue ReadValue(const KeyRow& row, std::string_view value, ValueSource source);

// Stores a value that is usable.
void StoreValue(const KeyRow& row, const SettingValue& value);
// Whether the key holds that value now.
bool HoldsValue(const KeyRow& row, const SettingValue& value);

// The value in force, or the default, as the configuration file holds it.
std::string ValueText(const KeyRow& row);
std::string DefaultValueText(const KeyRow& row);  // as the file would say it

// What the key takes, for people: "PngCompression takes a number from 0 to 9." Empty without a
// fault.
std::string FaultMessage(const KeyRow& row, ValueFault fault);

}  // namespace fotomill
