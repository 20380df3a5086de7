#pragma once

#include <cstdint>
#include <span>
#include <string_view>
#include <vector>

#include "settings/key_table.h"

namespace fotomill::desktop {

// The pages of Setup, in list order.
enum class SetupPage {
  Browsing,
  Thumbnails,
  Viewing,
  Batches,
  Saving,
  FormatOptions,
  Names,
  Colors,
  Captions,
  Printing,
  Metadata,
  Archives,
  History,
  Formats,
  Keyboard  // has no settings but the keys of commands
};
inline constexpr size_t kSetupPageCount = 15;
// Title of a page, in English.
const char* TitleOf(SetupPage page);

// A setting in a Setup page or options dialog: page, group, key, label. Rows of a page and group
// are adjacent, in display order. To add a setting to Setup, add a row here, or for a format in its
// rows.cpp, and an entry in docs/user/settings.md.
struct SetupItem {
  SetupPage page;
  const char* group;
  KeyNumber key;
  const char* label;
};
// All rows, and those of one page, in display order.
std::span<const SetupItem> SetupItems();
std::vector<SetupItem> ItemsOf(SetupPage page);

// Settings whose label, group, page, key or help contains all words, ignoring case; in row order.
// Empty for an empty text.
std::vector<SetupItem> FindSettings(std::string_view words);

// Whether a key is a bit mask of file functions, shown as a check list (FileHistoryFunctions).
bool IsFunctionMask(KeyNumber key);

}  // namespace fotomill::desktop
