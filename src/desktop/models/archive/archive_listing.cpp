#include "desktop/models/archive/archive_listing.h"

#include <algorithm>

#include "archive/archive_kind.h"
#include "archive/archive_limits.h"
#include "archive/archive_reader.h"
#include "archive/packed_sizes.h"
#include "core/natural_order.h"
#include "core/text.h"
#include "desktop/models/history/history_dates.h"
#include "platform/file_view.h"
#include "platform/paths.h"
#include "registry/registry.h"
#include "texts/status_text.h"
#include "texts/texts.h"

namespace fotomill::desktop {

namespace {

std::string FolderIn(const std::string& entry) {
  const size_t slash = entry.rfind('/');
  return slash == std::string::npos ? std::string() : entry.substr(0, slash);
}
std::string NameIn(const std::string& entry) { return entry.substr(entry.rfind('/') + 1); }

std::string TypeOf(const std::string& entry) {
  return UpperCase(platform::ExtensionOf(NameIn(entry)));
}

// Saved space in percent; none if unknown.
std::optional<int64_t> RatioOf(const ArchiveRow& row) {
  if (!row.size || !row.packed || *row.size == 0) return {};
  const double kept = static_cast<double>(*row.packed) / static_cast<double>(*row.size);
  return static_cast<int64_t>(100.5 - 100 * kept);
}

std::string ProblemOf(const ArchiveEnd& end) {
  std::string text = StatusText(end.status);
  if (end.trouble != ArchiveTrouble::None) text.append(" ").append(Tr(TroubleText(end.trouble)));
  return text;
}

}  // namespace

ArchiveListing ReadArchiveListing(const std::string& path) {
  ArchiveListing listing;
  std::map<std::string, uint64_t> packed;
  platform::FileView file;
  if (file.Open(path)) {
    const bool zip = ArchiveKindOf(file.Bytes()).type == ArchiveKind::Zip;
    listing.canAdd = zip;
    if (zip) packed = ZipPackedSizes(file.Bytes(), archiveLimits.entries);
    file.Close();
  }
  std::vector<ArchiveEntry> entries;
  const ArchiveEnd end = ListArchive({path, {}, {}}, entries);
  if (end.status != Status::Ok) listing.problem = ProblemOf(end);
  for (const ArchiveEntry& entry : entries) {
    if (entry.facts.kind == RawEntry::Folder) continue;
    ArchiveRow row{.entry = entry.name, .size = {}, .packed = {}, .refused = {}};
    if (entry.facts.sizeKnown) row.size = entry.facts.size;
    if (const auto found = packed.find(entry.name); found != packed.end())
      row.packed = found->second;
    row.modified = entry.facts.modified;
    row.encrypted = entry.facts.encrypted;
    if (entry.refusal != EntryRefusal::None) row.refused = Tr(RefusalText(entry.refusal));
    listing.rows.push_back(std::move(row));
  }
  return listing;
}

std::span<const ArchiveColumnFacts> ArchiveColumns() {
  using enum KeyNumber;
  static constexpr ArchiveColumnFacts kColumns[] = {
      {TrLater("Name"), ArchiveListNameSize, 220, false},
      {TrLater("Folder"), ArchiveListPathSize, 160, false},
      {TrLater("Type"), ArchiveListTypeSize, 60, false},
      {TrLater("Size"), ArchiveListUnpackedSize, 90, true},
      {TrLater("Packed"), ArchiveListPackedSize, 90, true},
      {TrLater("Saved"), ArchiveListRatioSize, 75, true},
      {TrLater("Modified"), ArchiveListModifiedSize, 150, false},
  };
  return kColumns;
}

std::string ArchiveCell(const ArchiveRow& row, int32_t column, int32_t dateMode) {
  const auto number = [](const auto& value) {
    return value ? ThousandsText(static_cast<uint64_t>(*value)) : std::string("-");
  };
  switch (column) {
    case kEntryName: return NameIn(row.entry) + (row.encrypted ? " *" : "");
    case kEntryPath: return FolderIn(row.entry);
    case kEntryType: return TypeOf(row.entry);
    case kEntrySize: return number(row.size);
    case kEntryPacked: return number(row.packed);
    case kEntryRatio: {
      const auto ratio = RatioOf(row);
      return ratio ? std::to_string(*ratio) + " %" : "-";
    }
    default: return row.modified == 0 ? std::string("-") : HistoryDate(row.modified, dateMode);
  }
}

void SortArchive(std::vector<ArchiveRow>& rows, int32_t column, bool descending) {
  const auto order = [column](const ArchiveRow& a, const ArchiveRow& b) -> int {
    const auto compare = [](const auto& x, const auto& y) { return x < y ? -1 : y < x ? 1 : 0; };
    switch (column) {
      case kEntryPath: return CompareNatural(FolderIn(a.entry), FolderIn(b.entry));
      case kEntryType: return CompareNatural(TypeOf(a.entry), TypeOf(b.entry));
      case kEntrySize: return compare(a.size, b.size);
      case kEntryPacked: return compare(a.packed, b.packed);
      case kEntryRatio: return compare(RatioOf(a), RatioOf(b));
      case kEntryModified: return compare(a.modified, b.modified);
      default: return CompareNatural(NameIn(a.entry), NameIn(b.entry));
    }
  };
  std::ranges::stable_sort(rows, [&](const ArchiveRow& a, const ArchiveRow& b) {
    const int first = order(a, b);
    if (first != 0) return descending ? first > 0 : first < 0;
    return CompareNatural(a.entry, b.entry) < 0;
  });
}

bool IsArchiveName(std::string_view name) {
  const auto extension = platform::ExtensionOf(name);
  return EqualIgnoringCase(extension, "zip") || EqualIgnoringCase(extension, "rar");
}

bool HasPictures(const ArchiveListing& listing) {
  return std::ranges::any_of(listing.rows, [](const ArchiveRow& row) {
    return !IsArchiveName(row.entry) && FindFormatByName(row.entry) != kNoFormat;
  });
}

}  // namespace fotomill::desktop
