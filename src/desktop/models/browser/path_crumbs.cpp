#include "desktop/models/browser/path_crumbs.h"

#include <algorithm>
#include <numeric>

#include "core/text.h"
#include "core/utf8.h"
#include "platform/folders.h"
#include "platform/paths.h"

namespace fotomill::desktop {

std::vector<Crumb> CrumbsOf(const std::string& folder) {
  std::vector<Crumb> crumbs;
  for (std::string at = folder; !at.empty();) {
    const std::string_view name = platform::FileNameOf(at);
    crumbs.push_back({name.empty() ? at : std::string(name), at});
    std::string above = platform::AbsolutePath(platform::JoinFolder(at, ".."));
    if (above.size() >= at.size()) break;  // the root, or not an absolute path
    at = std::move(above);
  }
  std::ranges::reverse(crumbs);
  return crumbs;
}

std::vector<std::string> Completions(const std::string& typed,
                                     const std::vector<std::string>& names) {
  const std::string folder(platform::SplitPath(typed).folder);
  const std::string_view begun = std::string_view(typed).substr(folder.size());
  std::vector<std::string> paths;
  if (begun.empty() || std::ranges::find(names, begun) != names.end()) return paths;
  for (const std::string& name : names) {
    // Other names cannot be entered in a text field.
    if (IsUtf8(name) && EqualIgnoringCase(std::string_view(name).substr(0, begun.size()), begun))
      paths.push_back(folder + name);
  }
  std::stable_partition(paths.begin(), paths.end(),
                        [&](const std::string& path) { return path.starts_with(typed); });
  return paths;
}

size_t FirstCrumbShown(std::span<const int> widths, int room, int more) {
  if (std::accumulate(widths.begin(), widths.end(), 0) <= room) return 0;
  size_t first = widths.size();
  for (int used = more; first > 0 && (first == widths.size() || used + widths[first - 1] <= room);
       --first)
    used += widths[first - 1];
  return first;
}

}  // namespace fotomill::desktop
