#pragma once

#include <optional>
#include <string>
#include <vector>

namespace fotomill::desktop {

// The folders of the tabs that were closed last, TabHistoryMax at most. They are kept for later
// runs.
class ClosedTabs {
 public:
  // Takes up the list of earlier runs. Add puts a folder on top and writes the list.
  void Load();
  bool Empty() const { return folders_.empty(); }  // there is no tab to reopen
  void Add(const std::string& folder);
  // The folder of the tab closed last, which is forgotten; none if there is none.
  std::optional<std::string> Pop();

 private:
  std::vector<std::string> folders_;  // the latest last
};

}  // namespace fotomill::desktop
