#pragma once

#include <cstdint>
#include <string>
#include <string_view>
#include <utility>
#include <vector>

#include "settings/folder_override.h"

namespace fotomill::desktop {

// How a browser shows a folder.
struct FolderView {
  BrowserModes modes;
  bool descending = false;

  bool operator==(const FolderView&) const = default;
};

// How folders were last asked to be shown: order, direction and view mode, not where thumbnails
// come from. Kept in the data folder in the file "FMWFolderViews.txt", a line
// "VIEW,SORT,DESCENDING,FOLDER" each, the latest first, 500 at most.
class FolderViews {
 public:
  // `otherwise` with what is kept of a folder.
  FolderView Find(const std::string& folder, const FolderView& otherwise) const;
  // Remembers how a folder is shown, as the latest one.
  void Keep(const std::string& folder, const FolderView& view);

  // Takes up what the file holds; without one, nothing is kept of any folder.
  void Load();
  // Merges what was kept since the last call into the file, which other processes change too. False
  // when it cannot be written.
  [[nodiscard]] bool Save();

  // The text of the file. Lines that are not understood are passed over.
  static FolderViews Parse(std::string_view text);
  // The text that Parse reads.
  std::string Text() const;

 private:
  struct Entry {
    std::string folder;
    FolderView view;
  };
  std::vector<Entry> entries_;  // the latest first
  std::vector<Entry> unsaved_;  // the latest last
};

}  // namespace fotomill::desktop
