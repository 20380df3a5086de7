#pragma once

#include <cstddef>
#include <cstdint>
#include <span>
#include <string_view>

#include "core/choice_lists.h"

namespace fotomill {

// A key's type of value and of Setup control. Part of the plug-in interface, so the
// numbers are fixed.
enum KeyType : uint32_t {
  KEY_FLAG = 0x1,            // 0 or 1, a check box
  KEY_TEXT = 0x2,            // a NUL-terminated text of at most 260 characters
  KEY_INTEGER = 0x4,         // an integer in an edit field
  KEY_COLOR = 0x8,          // 0x00BBGGRR, edited by a color control
  KEY_CHOICE = 0x10,         // a combo or list box
  KEY_FILLED_TEXT = 0x20,    // a text whose control is filled by the dialog
  // an integer with a range, "minimum,maximum,step" in the text of control + 10000
  KEY_SPIN = 0x40,
  KEY_INTERNAL = 0x100,      // set by the program, never read from a file
  KEY_DESTINATION = 0x400,   // a choice of extensions of writable formats
  KEY_BY_VALUE = 0x800,      // a choice that stores the entry's value instead of its position
  KEY_STATUS = 0x1000,       // a status text without a control
  KEY_SETUP = 0x8000,        // changing the control sets the setup-changed mark
  KEY_TEXT_LIMIT = 0x10000,  // the text is limited to `extra` characters
};

// The extra field of a row: the list of a choice, the length limit of a text, else 0.
union KeyExtra {
  // NOLINT: implicit for table rows
  constexpr KeyExtra(int32_t limit) : textLimit(static_cast<uintptr_t>(limit)) {}
  // NOLINT: as above
  constexpr KeyExtra(const ChoiceEntry* list) : choices(list) {}
  uintptr_t textLimit;
  const ChoiceEntry* choices;
};

// One key. Plug-ins read the table in this layout: five words on 32-bit systems; elsewhere the
// pointers and `extra` are wider.
struct KeyRow {
  const char* name;
  void* variable;    // int32_t, or the characters of a text; points into `settings`
  uint32_t type;     // KeyType bits
  uint32_t control;  // number of the Setup control, 0 if none
  KeyExtra extra;
};
static_assert(sizeof(void*) != 4 || sizeof(KeyRow) == 20);  // the 32-bit ABI
// No padding with wider pointers.
static_assert(offsetof(KeyRow, type) == 2 * sizeof(void*) &&
              offsetof(KeyRow, extra) == 2 * sizeof(void*) + 8);

// Index of every key in the table, by name.
enum class KeyNumber : uint32_t {
#define SETTING(kind, key, control, extra, value) key,
#include "settings/settings.def"
#undef SETTING
  Count
};
// Number of keys.
inline constexpr size_t kKeyCount = static_cast<size_t>(KeyNumber::Count);

// All keys in table order, followed by their count.
struct KeyTable {
  KeyRow rows[kKeyCount];
  uint32_t count;
};
// Laid out for plug-ins; the program uses the functions below.
extern const KeyTable keyTable;

inline std::span<const KeyRow> Keys() { return keyTable.rows; }  // in table order
inline const KeyRow& KeyOf(KeyNumber number) { return keyTable.rows[static_cast<size_t>(number)]; }
// The index of a row, or of the row it was copied from.
size_t NumberOfKey(const KeyRow& row);

// The row with exactly that name, null if there is none. A linear
// search, as the table is not sorted; it starts at row `from` and
// wraps around, so that keys in table order are found at once.
const KeyRow* FindKey(std::string_view name, size_t from = 0);
// The row with that Setup control, null if there is none.
const KeyRow* FindKeyOfControl(uint32_t control);
// The key most likely meant by `typed`; never empty.
std::string_view NearestKey(std::string_view typed);

// The current value and the default. NumberIn is for keys without KEY_TEXT, TextIn for
// keys with it.
int32_t NumberIn(const KeyRow& row);
std::string_view TextIn(const KeyRow& row);  // the current value
int32_t DefaultNumber(const KeyRow& row);
std::string_view DefaultText(const KeyRow& row);
bool IsAtDefault(const KeyRow& row);  // its value equals the default
// Maximum length of the key's text, in bytes.
size_t TextLimit(const KeyRow& row);
// Whether the text becomes part of a file name and must not contain a path.
bool HoldsName(const KeyRow& row);
// Whether a flag may hold numbers other than 0 and 1.
bool IsLooseFlag(const KeyRow& row);

// Store a value without checks; texts that are too long are cut.
void StoreNumber(const KeyRow& row, int32_t number);
void StoreText(const KeyRow& row, std::string_view text);  // a text that is too long is cut
void StoreDefault(const KeyRow& row);  // number or text

}  // namespace fotomill
