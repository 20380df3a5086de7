#pragma once

#include <cstdint>
#include <span>
#include <string>
#include <vector>

#include "settings/key_table.h"

namespace fotomill::desktop {

// One column of the file history's list, in the order of choice::HistoryColumn. The key holds its
// width in ten-thousandths of the list's.
struct HistoryColumnFacts {
  const char* title;
  KeyNumber width;
  bool number;  // is at the right
};
// All columns, and what the widths of those that are shown add up to.
std::span<const HistoryColumnFacts> HistoryColumns();
inline constexpr int32_t kWholeWidth = 10000;

// An entry of the history, kept after the history itself was freed.
struct HistoryRow {
  std::string path;
  int32_t function = 0;
  int32_t created = 0, accessed = 0;  // seconds since 1970 UTC
  uint64_t size = 0;                  // bytes
};

// The entries of the file history in the order of a column. Belongs to the main thread.
class FileHistoryList {
 public:
  // Takes up the history as its file has it now, and sorts it as FileHistorySortMode says. False
  // when there is a file that cannot be read as one.
  bool Read();
  // Sorts by a column; the one that sorts already, the other way round. Times and sizes begin with
  // the largest.
  void SortBy(int32_t column);
  int32_t SortColumn() const { return column_; }
  bool Reversed() const { return reversed_; }

  // Rows from 0 in the order shown; a cell's text is as the list shows it, dates and sizes in
  // words.
  size_t Count() const { return rows_.size(); }
  const HistoryRow& Row(size_t row) const { return rows_[row]; }
  std::string Cell(size_t row, size_t column) const;

  // Takes entries out of the history file; what other programs recorded meanwhile stays. False when
  // it could not be written: the entries are still there.
  bool Remove(std::vector<size_t> rows);
  // Deletes the history file. False when it could not be deleted.
  bool Clear();

 private:
  void Sort();

  std::vector<HistoryRow> rows_;
  int32_t column_ = 0;
  bool reversed_ = false;
};

// Whether a row gets a thumbnail: not from drives of the kinds whose bits FileHistoryDriveTypes has
// set (2 removable, 16 optical by default), where reading a picture may mean waiting.
bool GetsThumbnail(const std::string& path);

}  // namespace fotomill::desktop
