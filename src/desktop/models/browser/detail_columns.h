#pragma once

#include <cstdint>
#include <span>
#include <string>
#include <string_view>
#include <vector>

#include "desktop/models/browser/folder_listing.h"

namespace fotomill::desktop {

// A column of the details view. The first one is always shown.
struct DetailFacts {
  const char* title;
  int32_t width;  // default, in device-independent pixels
  bool number;    // right-aligned
  bool shown;     // by default
  int32_t sort;   // choice::SortMode for clicks on the header, -1: none
  std::string (*text)(const FolderItem& item);
};
// All columns, in default order.
std::span<const DetailFacts> AllDetails();

// A column as arranged by the user.
struct DetailColumn {
  size_t detail = 0;  // index in AllDetails()
  int32_t width = 0;
  bool shown = true;

  bool operator==(const DetailColumn&) const = default;
};
using DetailColumns = std::vector<DetailColumn>;  // from left to right, each detail once

// Converts to and from "Name:260,Size:110,-Depth:70", with "-" for hidden columns. Missing columns
// come last, with defaults; invalid entries are ignored.
DetailColumns ParseDetailColumns(std::string_view text);
std::string DetailColumnsText(const DetailColumns& columns);

// Formats 20040831223208 as "2004-08-31 22:32"; 0 as nothing.
std::string DateNumberText(int64_t date);

}  // namespace fotomill::desktop
