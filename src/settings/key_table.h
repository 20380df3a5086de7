#pragma once

#include <cstddef>
#include <cstdint>
#include <span>
#include <string_view>

#include "core/choice_lists.h"

namespace fotomill {

// What kind of value a key has and how a Setup dialog edits it. Plug-ins see these bits, so their
// numbers stay.
enum KeyType : uint32_t {
  KEY_FLAG = 0x1,            // 0 or 1, a check box
  KEY_TEXT = 0x2,            // a zero-terminated text of at most 260 characters
  KEY_INTEGER = 0x4,         // an integer in an edit field
  KEY_COLOR = 0x8,          // 0x00BBGGRR; the control carries the color
  KEY_CHOICE = 0x10,         // a combo or list box
  KEY_FILLED_TEXT = 0x20,    // a text whose control is filled by the dialog itself
  // an integer with a range, "minimum,maximum,step" in the text of control + 10000
  KEY_SPIN = 0x40,
  KEY_INTERNAL = 0x100,      // the program's own value, never taken from a file
  KEY_DESTINATION = 0x400,   // a choice among the extensions of the formats that can write
  KEY_BY_VALUE = 0x800,      // a choice that holds the entry's value instead of its position
  KEY_STATUS = 0x1000,       // a status text without a control
  KEY_SETUP = 0x8000,        // a change of the control sets the setup-changed mark
  KEY_TEXT_LIMIT = 0x10000,  // the text is limited to `extra` characters
};

// The last word of a row: the list of a choice, or the longest text of a limited one, else 0.
union KeyExtra {
  // NOLINT: a cell of the table
  constexpr KeyExtra(int32_t limit) : textLimit(static_cast<uintptr_t>(limit)) {}
  // NOLINT: likewise
  constexpr KeyExtra(const ChoiceEntry* list) : choices(list) {}
  uintptr_t textLimit;
  const ChoiceEntry* choices;
};

// One key. Plug-ins read the table in this layout: five words on a 32-bit system, pointers and
// `extra` as wide as the system's pointers elsewhere.
struct KeyRow {
  const char* name;
  void* variable;    // int32_t, or the characters of a text; is in `settings`
  uint32_t type;     // KeyType bits
  uint32_t control;  // number of the Setup control, 0 for none
  KeyExtra extra;
};
static_assert(sizeof(void*) != 4 || sizeof(KeyRow) == 20);  // as 32-bit plug-ins see it
// No padding, wherever pointers are wider.
static_assert(offsetof(KeyRow, type) == 2 * sizeof(void*) &&
              offsetof(KeyRow, extra) == 2 * sizeof(void*) + 8);

// The place of every key in the table, by name.
enum class KeyNumber : uint32_t {
#define SETTING(kind, key, control, extra, value) key,
#include "settings/settings.def"
#undef SETTING
  Count
};
// How many keys there are.
inline constexpr size_t kKeyCount = static_cast<size_t>(KeyNumber::Count);

// All keys in table order, with their count right behind the rows.
struct KeyTable {
  KeyRow rows[kKeyCount];
  uint32_t count;
};
// Laid out for plug-ins; the program itself goes through the functions below.
extern const KeyTable keyTable;

inline std::span<const KeyRow> Keys() { return keyTable.rows; }  // in table order
inline const KeyRow& KeyOf(KeyNumber number) { return keyTable.rows[static_cast<size_t>(number)]; }
// The place of a row, or of the row that this one is a copy of.
size_t NumberOfKey(const KeyRow& row);

// The row of that very name, null if there is none. The table has no order to search by. `from` is
// the row where the search begins; it continues at the top, so that keys in table order are found
// at once.
const KeyRow* FindKey(std::string_view name, size_t from = 0);
// The row whose Setup control has that number, null when none has.
const KeyRow* FindKeyOfControl(uint32_t control);
// The key that someone who typed `typed` most likely meant; never empty.
std::string_view NearestKey(std::string_view typed);

// The value in force and the built-in default. NumberIn is for keys without KEY_TEXT, TextIn for
// those with it.
int32_t NumberIn(const KeyRow& row);
std::string_view TextIn(const KeyRow& row);  // of the key's variable now
int32_t DefaultNumber(const KeyRow& row);
std::string_view DefaultText(const KeyRow& row);
bool IsAtDefault(const KeyRow& row);  // its value is the default's
// The longest text that the key holds, in bytes.
size_t TextLimit(const KeyRow& row);
// Whether the text becomes part of a file name, so that it may not lead anywhere.
bool HoldsName(const KeyRow& row);
// Whether a flag keeps numbers other than 0 and 1.
bool IsLooseFlag(const KeyRow& row);

// Store a value as it is; a text that is too long is cut.
void StoreNumber(const KeyRow& row, int32_t number);
void StoreText(const KeyRow& row, std::string_view text);  // a text that is too long is cut
void StoreDefault(const KeyRow& row);  // number or text

}  // namespace fotomill
