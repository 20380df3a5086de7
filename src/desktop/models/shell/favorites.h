#pragma once

#include <string>
#include <vector>

namespace fotomill::desktop {

// The folders that the user wants at hand, in the order in which they were added. Kept in the data
// folder in the file "FMWFavourites.txt", a folder a line; changes are merged with those of other
// processes and written at once.
class Favorites {
 public:
  // Takes up the folders that the file holds now.
  void Load();
  // Absolute paths in the user's order.
  const std::vector<std::string>& Folders() const { return folders_; }
  // Whether the folder is one of them.
  bool Has(const std::string& folder) const;
  // False when the folder cannot be on a line, there are too many, or the file cannot be written.
  [[nodiscard]] bool Add(const std::string& folder);
  // False when the file cannot be written.
  [[nodiscard]] bool Remove(const std::string& folder);
  // A folder was renamed: it, and those in it, are found under the new name. True when that
  // concerns one of them.
  bool FollowRename(const std::string& from, const std::string& to);

 private:
  std::vector<std::string> folders_;
};

// Whether a folder is `above` or is in it.
bool LiesIn(const std::string& folder, const std::string& above);
// The path under which something in `from` is found after `from` was renamed to `to`.
std::string RenamedPath(const std::string& path, const std::string& from, const std::string& to);

}  // namespace fotomill::desktop
