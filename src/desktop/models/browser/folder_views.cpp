#include "desktop/models/browser/folder_views.h"

#include <algorithm>
#include <optional>

#include "core/choice_lists.h"
#include "core/data_folder.h"
#include "core/file_edit.h"
#include "core/limits.h"
#include "core/whole_number.h"
#include "platform/files.h"

namespace fotomill::desktop {

namespace {

constexpr const char* kFile = "FMWFolderViews.txt";
constexpr size_t kMostFolders = 500;

bool FitsLine(std::string_view folder) {
  return !folder.empty() &&
         folder.find_first_of(std::string_view("\n\r\0", 3)) == std::string_view::npos;
}

// Removes a number up to `last` and the comma after it from the line.
std::optional<int32_t> ReadField(std::string_view& line, int32_t last) {
  const size_t comma = line.find(',');
  if (comma == std::string_view::npos) return std::nullopt;
  const auto number = ParseNumber(line.substr(0, comma));
  line.remove_prefix(comma + 1);
  return number && *number >= 0 && *number <= last ? number : std::nullopt;
}

}  // namespace

FolderView FolderViews::Find(const std::string& folder, const FolderView& otherwise) const {
  const auto found = std::ranges::find(entries_, folder, &Entry::folder);
  if (found == entries_.end()) return otherwise;
  FolderView view = found->view;
  view.modes.thumbnails = otherwise.modes.thumbnails;
  return view;
}

void FolderViews::Keep(const std::string& folder, const FolderView& view) {
  if (!FitsLine(folder)) return;
  std::erase_if(entries_, [&](const Entry& entry) { return entry.folder == folder; });
  entries_.insert(entries_.begin(), {folder, view});
  entries_.resize(std::min(entries_.size(), kMostFolders));
  unsaved_.push_back({folder, view});
}

void FolderViews::Load() {
  std::string text;
  const std::string path = DataFile(kFile);
  if (!path.empty()) (void)platform::ReadWholeFile(path, limits.listFileBytes, text);
  *this = Parse(text);
}

bool FolderViews::Save() {
  if (unsaved_.empty()) return true;
  const EditResult result =
      EditTextFile(DataFile(kFile), limits.listFileBytes, [this](std::string& text) {
        FolderViews merged = Parse(text);
        for (const Entry& entry : unsaved_) merged.Keep(entry.folder, entry.view);
        text = merged.Text();
      });
  if (result != EditResult::Done && result != EditResult::Unchanged) return false;
  unsaved_.clear();
  return true;
}

FolderViews FolderViews::Parse(std::string_view text) {
  FolderViews views;
  while (!text.empty() && views.entries_.size() < kMostFolders) {
    const size_t end = std::min(text.find('\n'), text.size());
    std::string_view line = text.substr(0, end);
    text.remove_prefix(std::min(end + 1, text.size()));
    if (line.ends_with('\r')) line.remove_suffix(1);
    const auto view = ReadField(line, choice::kViewLarge);
    const auto sort = ReadField(line, choice::kSortDimensions);
    const auto descending = ReadField(line, 1);
    if (!view || !sort || !descending || !FitsLine(line)) continue;
    views.entries_.push_back({std::string(line), {{0, *view, *sort}, *descending != 0}});
  }
  return views;
}

std::string FolderViews::Text() const {
  std::string text;
  for (const Entry& entry : entries_) {
    const FolderView& view = entry.view;
    text += std::to_string(view.modes.view) + "," + std::to_string(view.modes.sort) + "," +
            (view.descending ? "1," : "0,") + entry.folder + "\n";
  }
  return text;
}

}  // namespace fotomill::desktop
