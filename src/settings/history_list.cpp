#include "settings/history_list.h"

#include <algorithm>
#include <functional>
#include <optional>

#include "core/data_folder.h"
#include "core/file_edit.h"
#include "core/fixed_text.h"
#include "core/limits.h"
#include "core/whole_number.h"
#include "platform/files.h"
#include "platform/paths.h"
#include "settings/settings.h"

namespace fotomill {

namespace {

constexpr int32_t kMostEntries = 1000;  // upper limit for all keys

struct ListFile {
  const char* name;
  int32_t Settings::*maximum;
};

// In the order of HistoryList.
constexpr ListFile kLists[] = {
    {"FMWMoveCopyHistory.txt", &Settings::CopyHistoryMax},
    {"FMWDestinationHistory.txt", &Settings::DestHistoryMax},
    {"FMWTabHistory.txt", &Settings::TabHistoryMax},
    {"FMWRenameHistory.txt", &Settings::EditListMaximum},
    {"FMWArchiveHistory.txt", &Settings::ArchiveHistoryMax},
    {"FMWPicturesearchHistory.txt", &Settings::PictureSearchHistoryMax},
};
constexpr ListFile kRecentFiles{"FileMenuHistory.txt", &Settings::RecentFilesMaximum};

const ListFile& FileOf(HistoryList list) { return kLists[static_cast<size_t>(list)]; }
size_t MostOf(const ListFile& file) {
  return static_cast<size_t>(std::clamp(settings.*file.maximum, 0, kMostEntries));
}

bool FitsOnLine(std::string_view entry) {
  return !entry.empty() && entry.size() <= PathText::Capacity() &&
         entry.find_first_of(std::string_view("\r\n\0", 3)) == std::string_view::npos;
}

std::string_view TakeLine(std::string_view& text) {
  const size_t feed = std::min(text.find('\n'), text.size());
  std::string_view line = text.substr(0, feed);
  text.remove_prefix(std::min(feed + 1, text.size()));
  if (line.ends_with('\r')) line.remove_suffix(1);
  return line;
}

bool IsReserved(std::string_view entry) { return entry == kDefaultEntry; }
bool IsReserved(const RecentFile& file) { return IsReserved(file.path); }

// Drops the last entries beyond `most`, not counting the reserved one, which is kept.
template <typename Entry>
void Limit(std::vector<Entry>& entries, size_t most) {
  std::vector<Entry> kept;
  size_t counted = 0;
  for (Entry& entry : entries) {
    if (IsReserved(entry) || ++counted <= most) kept.push_back(std::move(entry));
  }
  entries = std::move(kept);
}

// Collects the parsed lines without duplicates; the first one wins.
template <typename Entry, typename Parse, typename Same>
std::vector<Entry> ParseLines(std::string_view text, size_t most, Parse parse, Same same) {
  std::vector<Entry> entries;
  size_t counted = 0;
  while (!text.empty()) {
    const std::optional<Entry> entry = parse(TakeLine(text));
    if (!entry || (counted >= most && !IsReserved(*entry)) ||
        std::ranges::any_of(entries, [&](const Entry& other) { return same(other, *entry); }))
      continue;
    entries.push_back(*entry);
    counted += !IsReserved(*entry);
  }
  return entries;
}

std::optional<std::string> ParseEntry(std::string_view line) {
  return FitsOnLine(line) ? std::optional<std::string>(line) : std::nullopt;
}

std::optional<RecentFile> ParseRecentFile(std::string_view line) {
  const size_t comma = line.rfind(',');
  if (comma == std::string_view::npos || !FitsOnLine(line.substr(0, comma))) return std::nullopt;
  std::string_view rest = line.substr(comma + 1);
  const auto number = TakeNumber(rest);
  return number ? std::optional<RecentFile>({std::string(line.substr(0, comma)), *number})
                : std::nullopt;
}

bool SamePath(const RecentFile& a, const RecentFile& b) { return a.path == b.path; }

std::string LineOf(const std::string& entry) { return entry; }
std::string LineOf(const RecentFile& file) { return file.path + "," + std::to_string(file.number); }

template <typename Entry>
std::string TextOf(const std::vector<Entry>& entries) {
  std::string text;
  for (const Entry& entry : entries) text.append(LineOf(entry)).append(platform::kLineEnd);
  return text;
}

std::string ReadList(const ListFile& file) {
  std::string text;
  const std::string path = DataFile(file.name);
  if (!path.empty()) (void)platform::ReadWholeFile(path, limits.listFileBytes, text);
  return text;
}

bool EditList(const ListFile& file, const std::function<void(std::string&)>& edit) {
  const EditResult result = EditTextFile(DataFile(file.name), limits.listFileBytes, edit);
  return result == EditResult::Done || result == EditResult::Unchanged;
}

// The entries with a new one first, at most `most`.
template <typename Entry, typename Same>
void PutFirst(std::vector<Entry>& entries, const Entry& entry, size_t most, Same same) {
  std::erase_if(entries, [&](const Entry& other) { return same(other, entry); });
  entries.insert(entries.begin(), entry);
  Limit(entries, most);
}

}  // namespace

std::vector<std::string> ParseHistoryList(std::string_view text, size_t most) {
  return ParseLines<std::string>(text, most, ParseEntry, std::equal_to<std::string>());
}

std::vector<RecentFile> ParseRecentFiles(std::string_view text, size_t most) {
  return ParseLines<RecentFile>(text, most, ParseRecentFile, SamePath);
}

std::vector<std::string> LoadHistoryList(HistoryList list) {
  return ParseHistoryList(ReadList(FileOf(list)), MostOf(FileOf(list)));
}

bool AddToHistoryList(HistoryList list, std::string_view entry) {
  if (!FitsOnLine(entry)) return false;
  const size_t most = MostOf(FileOf(list));
  return EditList(FileOf(list), [&](std::string& text) {
    std::vector<std::string> entries = ParseHistoryList(text, most);
    PutFirst(entries, std::string(entry), most, std::equal_to<std::string>());
    text = TextOf(entries);
  });
}

std::vector<std::string> OfferedEntries(HistoryList list, std::string_view builtIn) {
  std::vector<std::string> entries = LoadHistoryList(list);
  if (std::ranges::find(entries, kDefaultEntry) == entries.end())
    entries.emplace_back(kDefaultEntry);
  std::erase(entries, builtIn);  // offered only once, at the reserved entry's position
  std::ranges::replace(entries, std::string(kDefaultEntry), std::string(builtIn));
  std::erase(entries, "");
  return entries;
}

bool AddChoice(HistoryList list, std::string_view entry, std::string_view builtIn) {
  return AddToHistoryList(list, entry == builtIn ? kDefaultEntry : entry);
}

bool RemoveFromHistoryList(HistoryList list, std::string_view entry) {
  return EditList(FileOf(list), [&](std::string& text) {
    std::vector<std::string> entries = ParseHistoryList(text, kMostEntries);
    if (std::erase(entries, entry) > 0) text = TextOf(entries);
  });
}

bool ClearHistoryList(HistoryList list) {
  return EditList(FileOf(list), [](std::string& text) { text.clear(); });
}

std::vector<RecentFile> LoadRecentFiles() {
  return ParseRecentFiles(ReadList(kRecentFiles), MostOf(kRecentFiles));
}

bool AddRecentFile(const RecentFile& file) {
  if (!FitsOnLine(file.path)) return false;
  const size_t most = MostOf(kRecentFiles);
  return EditList(kRecentFiles, [&](std::string& text) {
    std::vector<RecentFile> files = ParseRecentFiles(text, most);
    PutFirst(files, file, most, SamePath);
    text = TextOf(files);
  });
}

}  // namespace fotomill
