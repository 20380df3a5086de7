#pragma once

#include <cstdint>
#include <span>
#include <string>
#include <string_view>
#include <vector>

#include "desktop/models/browser/folder_listing.h"

namespace fotomill::desktop {

// What a column of the details tells. The first one is always shown.
struct DetailFacts {
  const char* title;
  int32_t width;  // device-independent pixels, until the user changes it
  bool number;    // to the right
  bool shown;     // unless the user chooses otherwise
  int32_t sort;   // choice::SortMode that a click on its head asks for, -1 for none
  std::string (*text)(const FolderItem& item);
};
// Every column there is, in the order in which they are at first.
std::span<const DetailFacts> AllDetails();

// A column as the user has arranged it.
struct DetailColumn {
  size_t detail = 0;  // of AllDetails()
  int32_t width = 0;
  bool shown = true;

  bool operator==(const DetailColumn&) const = default;
};
using DetailColumns = std::vector<DetailColumn>;  // from left to right, every detail once

// "Name:260,Size:110,-Depth:70", hidden ones behind a "-", and back. What the text lacks comes
// last, as it is without a text; what is not understood is passed over.
DetailColumns ParseDetailColumns(std::string_view text);
std::string DetailColumnsText(const DetailColumns& columns);

}  // namespace fotomill::desktop
