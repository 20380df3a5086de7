#pragma once

#include <cstdint>
#include <string>
#include <string_view>

namespace fotomill {

// How a browser shows a folder; the numbers are those of choice_lists.h.
struct BrowserModes {
  int32_t thumbnails = 0;  // choice::ThumbnailMode
  int32_t view = 0;        // choice::ViewMode
  int32_t sort = 0;        // choice::SortMode

  bool operator==(const BrowserModes&) const = default;
};

// The modes that a browser takes when it comes to a folder: those that the folder's file
// "fmwpro.override" sets, and `current` where it sets none, cannot be read, or UseFolderOverrides
// is off.
BrowserModes ModesForFolder(const std::string& folder, const BrowserModes& current);

// The same for the text of such a file: the keys ThumbnailMode, ViewMode and SortMode of the
// section "Fotomill". A value that is no number, or an unknown mode, sets nothing.
BrowserModes ModesInOverride(std::string_view text, const BrowserModes& current);

}  // namespace fotomill
