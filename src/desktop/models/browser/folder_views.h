#pragma once

#include <cstdint>
#include <string>
#include <string_view>
#include <utility>
#include <vector>

#include "settings/folder_override.h"

namespace fotomill::desktop {

// The view of a folder.
struct FolderView {
  BrowserModes modes;
  bool descending = false;

  bool operator==(const FolderView&) const = default;
};

// The user's last choices per folder: order, direction and view mode, but not the thumbnail mode.
// Stored in the file "FMWFolderViews.txt" in the data folder, in lines
// "VIEW,SORT,DESCENDING,FOLDER", latest first, at most 500.
class FolderViews {
 public:
  // The view stored for a folder, with all else from `otherwise`.
  FolderView Find(const std::string& folder, const FolderView& otherwise) const;
  // Stores the view of a folder, as the latest one.
  void Keep(const std::string& folder, const FolderView& view);

  // Loads the file; if missing, the list is empty.
  void Load();
  // Merges changes since the last call into the file, which other processes may change too. False
  // if it cannot be written.
  [[nodiscard]] bool Save();

  // Parses the text of the file, ignoring invalid lines.
  static FolderViews Parse(std::string_view text);
  // The text for Parse.
  std::string Text() const;

 private:
  struct Entry {
    std::string folder;
    FolderView view;
  };
  std::vector<Entry> entries_;  // latest first
  std::vector<Entry> unsaved_;  // latest last
};

}  // namespace fotomill::desktop
