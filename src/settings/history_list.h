#pragma once

#include <cstdint>
#include <string>
#include <string_view>
#include <vector>

namespace fotomill {

// Lists of recently used items, the latest first: text files in the data folder, one entry per
// line. A key tells how long each may get. Changes are merged with those of other processes and
// written in one step.

// The entry, and the value of several text keys, that stands for the built-in choice.
inline constexpr std::string_view kDefaultEntry = "~~~DEFAULT~~~";

// Each list with its file, the key that tells its length, and what it is of.
enum class HistoryList {
  // "FMWMoveCopyHistory.txt", CopyHistoryMax: folders that files were moved or copied to
  MoveCopy,
  Destination,    // "FMWDestinationHistory.txt", DestHistoryMax: folders that functions wrote to
  // "FMWArchiveHistory.txt", ArchiveHistoryMax: folders that archives were extracted to
  Archive,
  PictureSearch,  // "FMWPicturesearchHistory.txt", PictureSearchHistoryMax: what was searched for
  Tabs,           // "FMWTabHistory.txt", TabHistoryMax: folders of closed tabs
  RenameBases,    // "FMWRenameHistory.txt", EditListMaximum: base names of sequential renaming
};

// The entries that may be offered. Empty if there is no list or it cannot be read.
std::vector<std::string> LoadHistoryList(HistoryList list);
// Puts an entry first, once. False when it cannot be on a line (it is empty, over 260 bytes or
// holds a line break or zero byte) or the list cannot be written; the list is then unchanged.
[[nodiscard]] bool AddToHistoryList(HistoryList list, std::string_view entry);
// Takes an entry out; true as well when it was not there.
[[nodiscard]] bool RemoveFromHistoryList(HistoryList list, std::string_view entry);
[[nodiscard]] bool ClearHistoryList(HistoryList list);  // false when the list cannot be written

// An entry of the File menu: "FileMenuHistory.txt" holds lines "PATH,NUMBER", RecentFilesMaximum of
// them.
struct RecentFile {
  std::string path;
  int32_t number = 0;  // what the window that opened it makes of it

  bool operator==(const RecentFile&) const = default;
};
// The entries that may be offered, the latest first. Empty if there are none or the file cannot
// be read.
std::vector<RecentFile> LoadRecentFiles();
// As for the lists above; the path decides what is the same entry.
[[nodiscard]] bool AddRecentFile(const RecentFile& file);

// The texts of these files: at most `most` entries that can be used, and back.
std::vector<std::string> ParseHistoryList(std::string_view text, size_t most);
// The last comma parts path and number, so that paths with commas come back whole.
std::vector<RecentFile> ParseRecentFiles(std::string_view text, size_t most);

}  // namespace fotomill
