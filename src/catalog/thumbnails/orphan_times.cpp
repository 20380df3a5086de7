#include "catalog/thumbnails/orphan_times.h"

#include <algorithm>
#include <string_view>

#include "core/data_folder.h"
#include "core/file_edit.h"
#include "core/limits.h"
#include "core/whole_number.h"
#include "platform/files.h"

namespace fotomill {

namespace {

constexpr const char* kFile = "FMWThumbnailCleanUp.txt";
constexpr size_t kMostFolders = 5000;

struct Line {
  int64_t time = 0;
  std::string_view folder;
};

// Removes the next line from a text, including its end; invalid lines have no folder.
Line TakeLine(std::string_view& text) {
  std::string_view line = text.substr(0, text.find('\n'));
  text.remove_prefix(std::min(line.size() + 1, text.size()));
  if (line.ends_with('\r')) line.remove_suffix(1);
  const size_t comma = line.find(',');
  if (comma == std::string_view::npos) return {};
  const auto time = ParseNumber<int64_t>(line.substr(0, comma));
  return time ? Line{*time, line.substr(comma + 1)} : Line{};
}

std::string TextOf(int64_t time, std::string_view folder) {
  return std::to_string(time).append(",").append(folder).append("\n");
}

}  // namespace

int64_t LastOrphanRemoval(const std::string& folder) {
  const std::string path = DataFile(kFile);
  std::string contents;
  if (path.empty() ||
      platform::ReadWholeFile(path, limits.listFileBytes, contents) != platform::ReadResult::Done)
    return 0;
  for (std::string_view text = contents; !text.empty();) {
    const Line line = TakeLine(text);
    if (line.folder == folder) return line.time;
  }
  return 0;
}

bool KeepOrphanRemoval(const std::string& folder, int64_t time) {
  const std::string path = DataFile(kFile);
  const bool fits =
      !folder.empty() && folder.find_first_of(std::string_view("\n\r\0", 3)) == std::string::npos;
  if (path.empty() || !fits) return false;
  const EditResult result = EditTextFile(path, limits.listFileBytes, [&](std::string& contents) {
    std::string edited = TextOf(time, folder);
    size_t folders = 1;
    for (std::string_view text = contents; !text.empty() && folders < kMostFolders;) {
      const Line line = TakeLine(text);
      if (line.folder.empty() || line.folder == folder) continue;
      edited += TextOf(line.time, line.folder);
      ++folders;
    }
    contents = std::move(edited);
  });
  return result == EditResult::Done || result == EditResult::Unchanged;
}

}  // namespace fotomill
