#include "desktop/models/shell/closed_tabs.h"

#include <algorithm>

#include "settings/history_list.h"
#include "settings/settings.h"

namespace fotomill::desktop {

void ClosedTabs::Load() {
  folders_ = OfferedEntries(HistoryList::Tabs, {});
  std::ranges::reverse(folders_);
}

void ClosedTabs::Add(const std::string& folder) {
  std::erase(folders_, folder);
  folders_.push_back(folder);
  const size_t most = static_cast<size_t>(std::max(settings.TabHistoryMax, 1));
  if (folders_.size() > most)
    folders_.erase(folders_.begin(), folders_.end() - static_cast<ptrdiff_t>(most));
  (void)AddToHistoryList(HistoryList::Tabs, folder);
}

std::optional<std::string> ClosedTabs::Pop() {
  if (folders_.empty()) return std::nullopt;
  std::string folder = std::move(folders_.back());
  folders_.pop_back();
  (void)RemoveFromHistoryList(HistoryList::Tabs, folder);
  return folder;
}

}  // namespace fotomill::desktop
