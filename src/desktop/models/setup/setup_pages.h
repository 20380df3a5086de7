#pragma once

#include <cstdint>
#include <span>
#include <string_view>
#include <vector>

#include "settings/key_table.h"

namespace fotomill::desktop {

// The pages of Setup, in the order of the list at its left.
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
  Metadata,
  History,
  Formats
};
inline constexpr size_t kSetupPageCount = 12;
// The title of a page in English.
const char* TitleOf(SetupPage page);

// One setting in a Setup page or an option box: its page, the box around it, the key, its label.
// Rows of one page and group stand together, in the order in which they are shown. A new setting in
// Setup is a row here, or of a format one in its rows.cpp, and an entry in docs/user/settings.md.
struct SetupItem {
  SetupPage page;
  const char* group;
  KeyNumber key;
  const char* label;
};
// All rows, and those of one page, in the order in which they are shown.
std::span<const SetupItem> SetupItems();
std::vector<SetupItem> ItemsOf(SetupPage page);

// Settings whose label, group, page, key or help holds every word of `words`, whatever the case; in
// the order of the rows. Nothing for an empty text.
std::vector<SetupItem> FindSettings(std::string_view words);

// The file functions that FileHistoryFunctions switches, one bit each: a list to tick.
bool IsFunctionMask(KeyNumber key);

}  // namespace fotomill::desktop
