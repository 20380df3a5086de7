#include "desktop/models/files/folder_walk.h"

#include <algorithm>
#include <utility>

#include "core/natural_order.h"
#include "desktop/models/browser/folder_listing.h"
#include "platform/files.h"
#include "platform/paths.h"

namespace fotomill::desktop {

namespace {

constexpr int kDeepest = 64;  // of nested folders

// `below` is relative to the first folder; `levels` is how many more may follow.
void WalkBelow(const std::string& first, const std::string& below, int levels,
               const StopToken& stop, const FolderWalk& walk) {
  const std::string folder = below.empty() ? first : platform::JoinFolder(first, below);
  FolderListing listing = ListForBrowser(folder, false, stop);
  if (listing.state != FolderState::Listed) return walk.problem(listing.problem);
  std::ranges::sort(listing.items, [](const FolderItem& a, const FolderItem& b) {
    return CompareNatural(a.name, b.name) < 0;
  });
  std::vector<std::string> names, folders;
  for (const FolderItem& item : listing.items) {
    std::string name = below.empty() ? item.name : platform::JoinFolder(below, item.name);
    if (!item.folder) {
      names.push_back(std::move(name));
    } else if (levels > 0 && !platform::FactsOf(platform::JoinFolder(first, name)).link) {
      folders.push_back(std::move(name));
    }
  }
  walk.files(names);
  for (const std::string& next : folders) {
    if (stop.Asked()) return;
    WalkBelow(first, next, levels - 1, stop, walk);
  }
}

}  // namespace

void WalkFolder(const std::string& folder, bool subfolders, const StopToken& stop,
                const FolderWalk& walk) {
  WalkBelow(folder, "", subfolders ? kDeepest : 0, stop, walk);
}

}  // namespace fotomill::desktop
