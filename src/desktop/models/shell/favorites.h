#pragma once

#include <string>
#include <vector>

namespace fotomill::desktop {

// The user's favorite folders, in the order added. Stored in the file "FMWFavourites.txt" in the
// data folder, one per line; changes are saved immediately and merged with those of other
// processes.
class Favorites {
 public:
  // Loads the file.
  void Load();
  // Absolute paths in the user's order.
  const std::vector<std::string>& Folders() const { return folders_; }
  // Whether the folder is one of them.
  bool Has(const std::string& folder) const;
  // False if the folder cannot be stored, there are too many, or the file cannot be written.
  [[nodiscard]] bool Add(const std::string& folder);
  // False if the file cannot be written.
  [[nodiscard]] bool Remove(const std::string& folder);
  // After a folder was renamed: updates it and its
  // subfolders. True if any favorite was affected.
  bool FollowRename(const std::string& from, const std::string& to);

 private:
  std::vector<std::string> folders_;
};

// Whether a folder is `above` or inside it.
bool LiesIn(const std::string& folder, const std::string& above);
// The new path of something in `from` after `from` was renamed to `to`.
std::string RenamedPath(const std::string& path, const std::string& from, const std::string& to);

}  // namespace fotomill::desktop
