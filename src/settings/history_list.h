#pragma once

#include <cstdint>
#include <string>
#include <string_view>
#include <vector>

namespace fotomill {

// Lists of recently used items, the latest first: text files in the data folder, one entry per
// line. A key limits the length of each. Changes are merged with those of other processes and
// written atomically.

// The entry for the built-in choice; also used as a value of several text keys. It does not count
// toward the length of a list and is never dropped.
inline constexpr std::string_view kDefaultEntry = "~~~DEFAULT~~~";

// Each list with its file, the key for its length, and its contents.
enum class HistoryList {
  // "FMWMoveCopyHistory.txt", CopyHistoryMax: destinations of moved or copied files
  MoveCopy,
  Destination,  // "FMWDestinationHistory.txt", DestHistoryMax: output folders
  Tabs,         // "FMWTabHistory.txt", TabHistoryMax: folders of closed tabs
  RenameBases,  // "FMWRenameHistory.txt", EditListMaximum: base names of sequential renaming
  Archives,     // "FMWArchiveHistory.txt", ArchiveHistoryMax: folders for extracted files
  // "FMWPicturesearchHistory.txt", PictureSearchHistoryMax: folders that were searched
  PictureSearch,
};

// The valid entries. Empty if the list is missing or cannot be read.
std::vector<std::string> LoadHistoryList(HistoryList list);
// The entries to offer, with kDefaultEntry replaced by `builtIn`, which comes last if the list has
// no such entry. An empty `builtIn` is not offered.
std::vector<std::string> OfferedEntries(HistoryList list, std::string_view builtIn);
// Moves or adds an entry to the top. False if it cannot be stored in a line (it is empty, over 260
// bytes or contains a line break or NUL) or the list cannot be written; the list is then unchanged.
[[nodiscard]] bool AddToHistoryList(HistoryList list, std::string_view entry);
// The same for a choice from OfferedEntries: `builtIn` is stored as kDefaultEntry.
[[nodiscard]] bool AddChoice(HistoryList list, std::string_view entry, std::string_view builtIn);
// Removes an entry; also true if it was not listed.
[[nodiscard]] bool RemoveFromHistoryList(HistoryList list, std::string_view entry);
[[nodiscard]] bool ClearHistoryList(HistoryList list);  // false if the list cannot be written

// An entry of the File menu: "FileMenuHistory.txt" has lines "PATH,NUMBER", at
// most RecentFilesMaximum.
struct RecentFile {
  std::string path;
  int32_t number = 0;  // meaning defined by the window that opened it

  bool operator==(const RecentFile&) const = default;
};
// The valid entries, the latest first. Empty if
// there are none or the file cannot be read.
std::vector<RecentFile> LoadRecentFiles();
// As for the lists above; entries with the same path are duplicates.
[[nodiscard]] bool AddRecentFile(const RecentFile& file);

// Parses the text of such a file: at most `most` valid entries.
std::vector<std::string> ParseHistoryList(std::string_view text, size_t most);
// The last comma separates path and number, so paths may contain commas.
std::vector<RecentFile> ParseRecentFiles(std::string_view text, size_t most);

}  // namespace fotomill
