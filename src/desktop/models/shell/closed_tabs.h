#pragma once

#include <optional>
#include <string>
#include <vector>

namespace fotomill::desktop {

// The folders of recently closed tabs, at
// most TabHistoryMax, also of earlier runs.
class ClosedTabs {
 public:
  // Loads the list of earlier runs. Add appends a folder and saves the list.
  void Load();
  bool Empty() const { return folders_.empty(); }  // no tab to reopen
  void Add(const std::string& folder);
  // Removes and returns the last closed tab's folder, if any.
  std::optional<std::string> Pop();

 private:
  std::vector<std::string> folders_;  // latest last
};

}  // namespace fotomill::desktop
