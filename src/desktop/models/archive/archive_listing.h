#pragma once

#include <cstdint>
#include <optional>
#include <span>
#include <string>
#include <vector>

#include "settings/key_table.h"

namespace fotomill::desktop {

// A file in an archive.
struct ArchiveRow {
  std::string entry;                     // its whole name in the archive
  std::optional<uint64_t> size, packed;  // bytes
  int64_t modified = 0;                  // seconds since 1970 UTC; 0: unknown
  bool encrypted = false;
  std::string refused;  // why it cannot be extracted, a sentence; empty: it can
};

// The contents of an archive.
struct ArchiveListing {
  std::string problem;  // why not everything is listed, a sentence; else empty
  std::vector<ArchiveRow> rows;
  bool canAdd = false;  // files can be added: a ZIP archive
};
// May take long; any thread.
ArchiveListing ReadArchiveListing(const std::string& path);

// The columns of the archive manager, by number; ArchiveSortMode is one of them, plus
// kDescendingOrder.
enum ArchiveColumn : int32_t {
  kEntryName,
  kEntryPath,
  kEntryType,
  kEntrySize,
  kEntryPacked,
  kEntryRatio,
  kEntryModified
};
inline constexpr int32_t kDescendingOrder = 100;
struct ArchiveColumnFacts {
  const char* title;
  KeyNumber width;  // its key; 0 there: `usual`
  int usual;        // device-independent pixels
  bool number;
};
std::span<const ArchiveColumnFacts> ArchiveColumns();
// `dateMode` is a choice::DateMode.
std::string ArchiveCell(const ArchiveRow& row, int32_t column, int32_t dateMode);
void SortArchive(std::vector<ArchiveRow>& rows, int32_t column, bool descending);

// Whether a name is that of an archive.
bool IsArchiveName(std::string_view name);
// Whether the archive has a file with the name of a picture.
bool HasPictures(const ArchiveListing& listing);

}  // namespace fotomill::desktop
