#include "desktop/models/history/file_history_list.h"

#include <algorithm>

#include "catalog/history/file_history.h"
#include "core/choice_lists.h"
#include "core/natural_order.h"
#include "core/text.h"
#include "desktop/models/history/history_dates.h"
#include "platform/files.h"
#include "platform/paths.h"
#include "platform/volumes.h"
#include "registry/registry.h"
#include "settings/job_options.h"
#include "settings/settings.h"
#include "texts/texts.h"

namespace fotomill::desktop {

namespace {

// clang-format off
constexpr HistoryColumnFacts kColumns[] = {
    {TrLater("Name"),      KeyNumber::FileHistoryListNameSize,     false},
    {TrLater("Type"),      KeyNumber::FileHistoryListTypeSize,     false},
    {TrLater("Function"),  KeyNumber::FileHistoryListFunctionSize, false},
    {TrLater("Created"),   KeyNumber::FileHistoryListCreatedSize,  false},
    {TrLater("Accessed"),  KeyNumber::FileHistoryListAccessedSize, false},
    {TrLater("File size"), KeyNumber::FileHistoryListFilesizeSize, true},
    {TrLater("Path"),      KeyNumber::FileHistoryListPathSize,     false},
};
// clang-format on

// Negative if `a` comes before `b`. Ties are sorted by name, then last use.
int Compare(const HistoryRow& a, const HistoryRow& b, int32_t column) {
  const auto larger = [](auto left, auto right) {
    return left > right ? -1 : left < right ? 1 : 0;
  };
  int order = 0;
  switch (column) {
    case choice::kColumnType:
      order = DescribeFileType(a.path).compare(DescribeFileType(b.path));
      break;
    case choice::kColumnFunction:
      order = FileFunctionName(a.function).compare(FileFunctionName(b.function));
      break;
    case choice::kColumnCreated: order = larger(a.created, b.created); break;
    case choice::kColumnAccessed: order = larger(a.accessed, b.accessed); break;
    case choice::kColumnSize: order = larger(a.size, b.size); break;
    case choice::kColumnPath:
      order = CompareNatural(platform::FolderOf(a.path), platform::FolderOf(b.path));
      break;
    default: break;
  }
  if (order == 0)
    order = CompareNatural(platform::FileNameOf(a.path), platform::FileNameOf(b.path));
  return order != 0 ? order : larger(a.accessed, b.accessed);
}

}  // namespace

std::span<const HistoryColumnFacts> HistoryColumns() { return kColumns; }

bool FileHistoryList::Read() {
  rows_.clear();
  ClearFileHistory();
  const bool read = LoadFileHistory(HistoryOptionsFromSettings());
  for (size_t i = 0; i < FileHistoryCount(); ++i) {
    const FileHistoryEntry entry = FileHistoryAt(i);
    rows_.push_back(
        {std::string(entry.path), entry.function, entry.created, entry.accessed, entry.size});
  }
  ClearFileHistory();
  column_ =
      std::clamp(settings.FileHistorySortMode, 0, static_cast<int32_t>(std::size(kColumns)) - 1);
  Sort();
  const std::string path = FileHistoryPath(HistoryOptionsFromSettings());
  return read || settings.FileHistoryEnable == 0 || path.empty() || !platform::FileExists(path);
}

void FileHistoryList::SortBy(int32_t column) {
  reversed_ = column == column_ && !reversed_;
  column_ = column;
  Sort();
}

void FileHistoryList::Sort() {
  std::ranges::sort(rows_, [this](const HistoryRow& a, const HistoryRow& b) {
    return reversed_ ? Compare(b, a, column_) < 0 : Compare(a, b, column_) < 0;
  });
}

std::string FileHistoryList::Cell(size_t row, size_t column) const {
  const HistoryRow& entry = rows_[row];
  switch (static_cast<int32_t>(column)) {
    case choice::kColumnName: return std::string(platform::FileNameOf(entry.path));
    case choice::kColumnType: return DescribeFileType(entry.path);
    case choice::kColumnFunction: return Tr(FileFunctionName(entry.function));
    case choice::kColumnCreated: return HistoryDate(entry.created, settings.FileHistoryDateMode);
    case choice::kColumnAccessed: return HistoryDate(entry.accessed, settings.FileHistoryDateMode);
    case choice::kColumnSize: return WithThousands(entry.size);
    default: return platform::FolderOf(entry.path);
  }
}

bool FileHistoryList::Remove(std::vector<size_t> rows) {
  std::vector<FileUse> uses;
  for (const size_t row : rows) uses.push_back({.path = rows_[row].path, .removed = true});
  if (UpdateFileHistory(HistoryOptionsFromSettings(), uses) != HistoryUpdate::Done) return false;
  std::ranges::sort(rows, std::greater<>());
  for (const size_t row : rows) rows_.erase(rows_.begin() + static_cast<std::ptrdiff_t>(row));
  return true;
}

bool FileHistoryList::Clear() {
  const std::string path = FileHistoryPath(HistoryOptionsFromSettings());
  rows_.clear();
  return path.empty() || !platform::FileExists(path) || platform::DeleteFile(path);
}

}  // namespace fotomill::desktop
