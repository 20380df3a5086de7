#pragma once

#include <cstdint>
#include <string>
#include <string_view>

namespace fotomill {

// How a browser shows a folder, as values of choice_lists.h.
struct BrowserModes {
  int32_t thumbnails = 0;  // choice::ThumbnailMode
  int32_t view = 0;        // choice::ViewMode
  int32_t sort = 0;        // choice::SortMode

  bool operator==(const BrowserModes&) const = default;
};

// The modes for a folder: those set in its file
// "fmwpro.override", and `current` for those it does not set,
// if it cannot be read, or if UseFolderOverrides is off.
BrowserModes ModesForFolder(const std::string& folder, const BrowserModes& current);

// As above, from the text of such a file: the keys ThumbnailMode, ViewMode and SortMode of the
// section "Fotomill". Invalid or unknown values are ignored.
BrowserModes ModesInOverride(std::string_view text, const BrowserModes& current);

}  // namespace fotomill
