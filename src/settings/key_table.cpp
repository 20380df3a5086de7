#include "settings/key_table.h"

#include <algorithm>
#include <array>
#include <cstring>
#include <functional>

#include "core/nearest_name.h"
#include "settings/settings.h"

namespace fotomill {

namespace {

enum class Kind : uint8_t {
  Flag,
  LooseFlag,
  SetupFlag,
  Integer,
  Spin,
  SetupSpin,
  Color,
  Choice,
  ValueChoice,
  InternalInteger,
  Text,
  SetupText,
  Name,
  InternalText,
  StatusText,
  Destination,
  Prefix,
};

constexpr uint32_t TypeOf(Kind kind) {
  switch (kind) {
    case Kind::Flag:
    case Kind::LooseFlag: return KEY_FLAG;
    case Kind::SetupFlag: return KEY_FLAG | KEY_SETUP;
    case Kind::Integer: return KEY_INTEGER;
    case Kind::Spin: return KEY_INTEGER | KEY_SPIN;
    case Kind::SetupSpin: return KEY_INTEGER | KEY_SPIN | KEY_SETUP;
    case Kind::Color: return KEY_INTEGER | KEY_COLOR;
    case Kind::Choice: return KEY_INTEGER | KEY_CHOICE;
    case Kind::ValueChoice: return KEY_INTEGER | KEY_CHOICE | KEY_BY_VALUE;
    case Kind::InternalInteger: return KEY_INTEGER | KEY_INTERNAL;
    case Kind::Text:
    case Kind::Name: return KEY_TEXT;
    case Kind::SetupText: return KEY_TEXT | KEY_SETUP;
    case Kind::InternalText: return KEY_TEXT | KEY_INTERNAL;
    case Kind::StatusText: return KEY_TEXT | KEY_STATUS;
    case Kind::Destination: return KEY_TEXT | KEY_CHOICE | KEY_DESTINATION;
    case Kind::Prefix: return KEY_TEXT | KEY_TEXT_LIMIT;
  }
  return 0;
}

constexpr Kind kKinds[] = {
#define SETTING(kind, key, control, extra, value) Kind::kind,
#include "settings/settings.def"
#undef SETTING
};

constexpr size_t kLimits[] = {
#define SETTING(kind, key, control, extra, value) sizeof(Setting##kind),
#include "settings/settings.def"
#undef SETTING
};

// Length and last letter of a name, compared before the names themselves.
constexpr uint16_t TagOf(std::string_view name) {
  return static_cast<uint16_t>((name.size() << 8) |
                               (name.empty() ? 0 : static_cast<unsigned char>(name.back())));
}

constexpr uint16_t kTags[] = {
#define SETTING(kind, key, control, extra, value) TagOf(#key),
#include "settings/settings.def"
#undef SETTING
};

template <size_t capacity>
constexpr void* VariableOf(FixedText<capacity>& text) {
  return text.data();
}
constexpr void* VariableOf(int32_t& number) { return &number; }

// Choices have a list, limited texts a limit, other rows nothing.
constexpr bool ExtraFits(Kind kind, const void*) {
  return kind == Kind::Choice || kind == Kind::ValueChoice;
}
constexpr bool ExtraFits(Kind kind, int32_t limit) {
  return kind == Kind::Prefix ? limit == static_cast<int32_t>(SettingPrefix::Capacity())
                              : limit == 0 && kind != Kind::Choice && kind != Kind::ValueChoice;
}
#define SETTING(kind, key, control, extra, value) static_assert(ExtraFits(Kind::kind, extra), #key);
#include "settings/settings.def"
#undef SETTING

consteval bool ControlsAreUnique() {
  std::array<uint32_t, kKeyCount> controls{
#define SETTING(kind, key, control, extra, value) control,
#include "settings/settings.def"
#undef SETTING
  };
  std::sort(controls.begin(), controls.end());
  for (size_t i = 1; i < kKeyCount; ++i) {
    if (controls[i] != 0 && controls[i] == controls[i - 1]) return false;
  }
  return controls.back() < 10000;  // 10000 and up are for the ranges of spin controls
}
static_assert(ControlsAreUnique());

// The matching variable in the defaults.
const void* DefaultOf(const KeyRow& row) {
  const char* const first = static_cast<const char*>(static_cast<const void*>(&settings));
  const char* const variable = static_cast<const char*>(row.variable);
  return static_cast<const char*>(static_cast<const void*>(&defaultSettings)) + (variable - first);
}

std::string_view TextAt(const void* characters, size_t limit) {
  const char* const text = static_cast<const char*>(characters);
  return {text, static_cast<size_t>(std::find(text, text + limit, '\0') - text)};
}

}  // namespace

constinit const KeyTable keyTable = {{
#define SETTING(kind, key, control, extra, value) \
  {#key, VariableOf(settings.key), TypeOf(Kind::kind), control, extra},
#include "settings/settings.def"
#undef SETTING
                                     },
                                     kKeyCount};
static_assert(offsetof(KeyTable, count) == kKeyCount * sizeof(KeyRow));

size_t NumberOfKey(const KeyRow& row) {
  const std::less<const KeyRow*> before;
  const bool original = !before(&row, keyTable.rows) && before(&row, keyTable.rows + kKeyCount);
  const KeyRow* const found =
      original ? &row : std::ranges::find(keyTable.rows, row.variable, &KeyRow::variable);
  return static_cast<size_t>(found - keyTable.rows);
}

const KeyRow* FindKey(std::string_view name, size_t from) {
  const uint16_t tag = TagOf(name);
  const auto find = [&](size_t first, size_t end) -> const KeyRow* {
    for (size_t i = first; i < end; ++i) {
      if (kTags[i] == tag && name == keyTable.rows[i].name) return &keyTable.rows[i];
    }
    return nullptr;
  };
  from = std::min(from, kKeyCount);
  const KeyRow* const found = find(from, kKeyCount);
  return found != nullptr ? found : find(0, from);
}

const KeyRow* FindKeyOfControl(uint32_t control) {
  if (control == 0) return nullptr;
  const auto found = std::ranges::find(Keys(), control, &KeyRow::control);
  return found == Keys().end() ? nullptr : &*found;
}

std::string_view NearestKey(std::string_view typed) {
  std::array<std::string_view, kKeyCount> names;
  std::ranges::transform(Keys(), names.begin(), &KeyRow::name);
  return NearestOfAll(typed, names);
}

int32_t NumberIn(const KeyRow& row) { return *static_cast<const int32_t*>(row.variable); }
std::string_view TextIn(const KeyRow& row) { return TextAt(row.variable, TextLimit(row)); }
int32_t DefaultNumber(const KeyRow& row) { return *static_cast<const int32_t*>(DefaultOf(row)); }
std::string_view DefaultText(const KeyRow& row) { return TextAt(DefaultOf(row), TextLimit(row)); }

bool IsAtDefault(const KeyRow& row) {
  return (row.type & KEY_TEXT) != 0 ? TextIn(row) == DefaultText(row)
                                    : NumberIn(row) == DefaultNumber(row);
}

size_t TextLimit(const KeyRow& row) { return kLimits[NumberOfKey(row)] - 1; }

bool HoldsName(const KeyRow& row) {
  const Kind kind = kKinds[NumberOfKey(row)];
  return kind == Kind::Name || kind == Kind::Prefix;
}

bool IsLooseFlag(const KeyRow& row) { return kKinds[NumberOfKey(row)] == Kind::LooseFlag; }

void StoreNumber(const KeyRow& row, int32_t number) {
  *static_cast<int32_t*>(row.variable) = number;
}

void StoreText(const KeyRow& row, std::string_view text) {
  const size_t limit = TextLimit(row);
  text = text.substr(0, limit);
  char* const characters = static_cast<char*>(row.variable);
  std::memset(characters, 0, limit + 1);
  std::memcpy(characters, text.data(), text.size());
}

void StoreDefault(const KeyRow& row) {
  if ((row.type & KEY_TEXT) != 0) {
    StoreText(row, DefaultText(row));
  } else {
    StoreNumber(row, DefaultNumber(row));
  }
}

}  // namespace fotomill
