#pragma once

#include <cstdint>
#include <span>
#include <string>
#include <vector>

#include "settings/key_table.h"

namespace fotomill::desktop {

// A column of the file history's list, in the order of choice::HistoryColumn. The key has its width
// in 1/10000 of the list's width.
struct HistoryColumnFacts {
  const char* title;
  KeyNumber width;
  bool number;  // right-aligned
};
// All columns, and the total width of those shown.
std::span<const HistoryColumnFacts> HistoryColumns();
inline constexpr int32_t kWholeWidth = 10000;

// A copy of a history entry, valid after the history is freed.
struct HistoryRow {
  std::string path;
  int32_t function = 0;
  int32_t created = 0, accessed = 0;  // seconds since 1970 UTC
  uint64_t size = 0;                  // bytes
};

// The entries of the file history, sorted by a column. Main thread only.
class FileHistoryList {
 public:
  // Loads the current history file, and sorts by FileHistorySortMode. False if the file exists but
  // is invalid.
  bool Read();
  // Sorts by a column; reverses the order if it is the current one. Times and sizes start with the
  // largest.
  void SortBy(int32_t column);
  int32_t SortColumn() const { return column_; }
  bool Reversed() const { return reversed_; }

  // Rows from 0 in display order; cell texts as
  // displayed, with formatted dates and sizes.
  size_t Count() const { return rows_.size(); }
  const HistoryRow& Row(size_t row) const { return rows_[row]; }
  std::string Cell(size_t row, size_t column) const;

  // Removes entries from the history file, keeping what other programs recorded meanwhile. False,
  // with the entries unchanged, if it could not be written.
  bool Remove(std::vector<size_t> rows);
  // Deletes the history file. False on failure.
  bool Clear();

 private:
  void Sort();

  std::vector<HistoryRow> rows_;
  int32_t column_ = 0;
  bool reversed_ = false;
};

}  // namespace fotomill::desktop
