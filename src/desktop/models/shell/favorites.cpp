#include "desktop/models/shell/favorites.h"

#include <algorithm>
#include <functional>

#include "core/data_folder.h"
#include "core/file_edit.h"
#include "core/limits.h"
#include "platform/files.h"
#include "platform/paths.h"
#include "settings/history_list.h"

namespace fotomill::desktop {

namespace {

constexpr const char* kFile = "FMWFavourites.txt";
constexpr size_t kMostFolders = 200;

// Edits the current list in the file. Sets `folders` to the result; unchanged if the file cannot be
// written.
bool EditList(std::vector<std::string>& folders,
              const std::function<void(std::vector<std::string>&)>& edit) {
  std::vector<std::string> changed;
  const EditResult result =
      EditTextFile(DataFile(kFile), limits.listFileBytes, [&](std::string& text) {
        changed = ParseHistoryList(text, kMostFolders);
        edit(changed);
        text.clear();
        for (const std::string& folder : changed) text.append(folder).append(platform::kLineEnd);
      });
  if (result != EditResult::Done && result != EditResult::Unchanged) return false;
  folders = std::move(changed);
  return true;
}

}  // namespace

void Favorites::Load() {
  std::string text;
  const std::string path = DataFile(kFile);
  if (!path.empty()) (void)platform::ReadWholeFile(path, limits.listFileBytes, text);
  folders_ = ParseHistoryList(text, kMostFolders);
}

bool Favorites::Has(const std::string& folder) const {
  return std::ranges::find(folders_, folder) != folders_.end();
}

bool Favorites::Add(const std::string& folder) {
  if (ParseHistoryList(folder, 1) != std::vector{folder}) return false;  // not storable as a line
  const bool written = EditList(folders_, [&](std::vector<std::string>& folders) {
    if (std::ranges::find(folders, folder) == folders.end() && folders.size() < kMostFolders)
      folders.push_back(folder);
  });
  return written && Has(folder);
}

bool Favorites::Remove(const std::string& folder) {
  return EditList(folders_,
                  [&](std::vector<std::string>& folders) { std::erase(folders, folder); });
}

bool Favorites::FollowRename(const std::string& from, const std::string& to) {
  if (std::ranges::none_of(folders_,
                           [&](const std::string& folder) { return LiesIn(folder, from); }))
    return false;
  return EditList(folders_, [&](std::vector<std::string>& folders) {
    for (std::string& folder : folders) folder = RenamedPath(folder, from, to);
  });
}

bool LiesIn(const std::string& folder, const std::string& above) {
  return folder == above || (!above.empty() && folder.starts_with(platform::JoinFolder(above, "")));
}

std::string RenamedPath(const std::string& path, const std::string& from, const std::string& to) {
  return LiesIn(path, from) ? to + path.substr(from.size()) : path;
}

}  // namespace fotomill::desktop
