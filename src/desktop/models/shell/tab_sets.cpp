#include "desktop/models/shell/tab_sets.h"

#include <algorithm>

#include "core/data_folder.h"
#include "core/natural_order.h"
#include "core/plain_name.h"
#include "platform/files.h"
#include "settings/settings.h"

namespace fotomill::desktop {

namespace {

constexpr std::string_view kExtension = ".fmwtabset";

bool IsTabSet(std::string_view file) {
  return file.size() > kExtension.size() && file.ends_with(kExtension);
}

}  // namespace

std::vector<std::string> TabSetNames() {
  std::vector<std::string> names;
  for (const platform::FolderEntry& entry :
       platform::ListFolder(DataFolder()).value_or(std::vector<platform::FolderEntry>())) {
    if (entry.kind != platform::FileKind::Regular || !IsTabSet(entry.name)) continue;
    names.push_back(entry.name.substr(0, entry.name.size() - kExtension.size()));
  }
  std::ranges::sort(
      names, [](const std::string& a, const std::string& b) { return CompareNatural(a, b) < 0; });
  return names;
}

std::string TabSetFile(std::string_view name) {
  const std::string file = std::string(name).append(kExtension);
  const bool fits =
      !name.empty() && !name.starts_with('.') && IsPlainName(file) && !DataFile(file).empty();
  return fits && name.find_first_of("\r\n") == std::string_view::npos ? file : std::string();
}

std::string CurrentTabSet() {
  const std::string file(settings.TabsetCurrentName.view());
  return IsTabSet(file) ? file.substr(0, file.size() - kExtension.size()) : file;
}

bool HasTabSet(std::string_view name) { return platform::FileExists(DataFile(TabSetFile(name))); }

bool DeleteTabSet(std::string_view name) {
  const std::string file = TabSetFile(name);
  return !file.empty() && platform::DeleteFile(DataFile(file));
}

}  // namespace fotomill::desktop
