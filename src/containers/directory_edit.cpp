// Source: Adobe, "TIFF Revision 6.0" (1992), section 2; the libtiff project, "The BigTIFF Design";
// CIPA DC-008-2012, section 4.6.
#include "containers/directory_edit.h"

#include <algorithm>
#include <iterator>
#include <unordered_set>

#include "containers/directory_bytes.h"
#include "core/limits.h"
#include "texts/texts.h"

namespace fotomill {

namespace {

constexpr uint16_t kExifPointer = 0x8769, kGpsPointer = 0x8825, kInteroperabilityPointer = 0xA005;
constexpr uint16_t kSubDirectories = 0x014A;
constexpr uint16_t kFirstHdpData = 0xBCC0;
constexpr uint16_t kLong = 4, kLong8 = 16;
constexpr int32_t kDeepest = 4;            // nesting depth of directories
constexpr uint64_t kMostPieces = 1 << 23;  // strips and tiles of all pages

// Pairs of entries with offsets and sizes of data; 0: unknown size, to the end of the file.
constexpr struct {
  uint16_t offsets, sizes;
} kDataTags[] = {{0x0111, 0x0117}, {0x0144, 0x0145}, {0x0201, 0x0202}, {0x0207, 0},
                 {0x0208, 0},      {0x0209, 0},      {0xBCC0, 0xBCC1}, {0xBCC2, 0xBCC3}};

struct Range {
  uint64_t begin, end;
  auto operator<=>(const Range&) const = default;
};

struct Entry {
  uint16_t tag = 0, type = 0;
  uint64_t count = 0;
  std::vector<uint8_t> field = {};  // as stored: the values, or their offset
  uint64_t value = 0, size = 0;     // offset and size of the values; size 0: unknown type
  bool outside = false;             // outside the entry
};

struct Directory {
  uint64_t at = 0;
  std::vector<Entry> entries;
  uint64_t next = 0;
  uint64_t oldEnd = 0;  // offset after it in the file
  size_t oldCount = 0;
  bool dirty = false;
};

class Editor : DirectoryBytes {
 public:
  Editor(std::span<const uint8_t> file, DirectoryEdit& edit, std::string& reason)
      : DirectoryBytes(file), edit_(edit), reason_(reason) {}

  Status Run(std::span<const DirectoryChange> changes) {
    edit_ = {};
    if (!ReadHeader()) return Damaged();
    MapAll();
    Directory first;
    if (!ReadDirectory(Number(FirstAt(), Word()), first)) return Damaged();
    RETURN_IF_BAD(EditSub(kExifPointer, ExifPlace::Exif, changes, first));
    RETURN_IF_BAD(EditSub(kGpsPointer, ExifPlace::Gps, changes, first));
    for (const DirectoryChange& change : changes) {
      if (change.place == ExifPlace::First) Apply(change, first);
    }
    if (first.dirty) {
      const uint64_t at = Place(first, true);
      if (at != first.at) Patch(FirstAt(), Bytes(at, Word()));
    }
    RETURN_IF_BAD(ClearFurther(changes, first.at));
    EraseReleased();
    std::ranges::sort(edit_.patches, {}, &DirectoryEdit::Patch::at);
    // directories that lead to each other
    const auto overlap = [](const DirectoryEdit::Patch& a, const DirectoryEdit::Patch& b) {
      return a.at + a.bytes.size() > b.at;
    };
    if (std::ranges::adjacent_find(edit_.patches, overlap) != edit_.patches.end()) return Damaged();
    return CheckGrowth();
  }

  std::vector<DirectoryValue> FindAll(uint16_t tag) {
    std::vector<DirectoryValue> values;
    if (!ReadHeader()) return values;
    MapAll();
    for (const uint64_t at : visited_) {
      Directory directory;
      if (!ReadDirectory(at, directory)) continue;
      for (const Entry& entry : directory.entries) {
        if (entry.tag == tag && Holds(entry.value, entry.size))
          values.push_back({entry.type, file_.subspan(entry.value, entry.size)});
      }
    }
    return values;
  }

  DirectoryValue FindFirst(uint16_t tag) {
    Directory first;
    if (!ReadHeader() || !ReadDirectory(Number(FirstAt(), Word()), first)) return {};
    const auto entry = std::ranges::find(first.entries, tag, &Entry::tag);
    if (entry == first.entries.end() || !Holds(entry->value, entry->size)) return {};
    return {entry->type, file_.subspan(entry->value, entry->size)};
  }

 private:
  Status Damaged() {
    reason_ = Tr("The directories of its EXIF are damaged.");
    return Status::DamagedFile;
  }

  bool ReadHeader() {
    if (file_.size() < 8 || !ReadOrder()) return false;
    used_.push_back({0, FirstAt() + Word()});
    return !wide_ || Number(4, 2) == 8;
  }

  std::vector<uint8_t> Bytes(uint64_t number, uint64_t size) const {
    std::vector<uint8_t> bytes(size);
    Store(number, bytes);
    return bytes;
  }
  uint64_t NumberOf(const Entry& entry, uint64_t i) const {
    return Element(entry.value, entry.type, i);
  }

  // False if it is not entirely within the file.
  bool ReadDirectory(uint64_t at, Directory& directory) {
    if (at < 8 || !Holds(at, CountBytes())) return false;
    const uint64_t count = Number(at, CountBytes()), entries = at + CountBytes();
    if (count > limits.exifEntries || !Holds(entries, count * EntryBytes())) return false;
    directory.at = at;
    directory.oldCount = count;
    for (uint64_t i = 0; i < count; ++i)
      directory.entries.push_back(ReadEntry(entries + i * EntryBytes()));
    directory.oldEnd = entries + count * EntryBytes();
    if (!Holds(directory.oldEnd, Word())) return true;  // blocks may end without a next one
    directory.next = Number(directory.oldEnd, Word());
    directory.oldEnd += Word();
    return true;
  }

  Entry ReadEntry(uint64_t at) const {
    Entry entry;
    entry.tag = static_cast<uint16_t>(Number(at, 2));
    entry.type = static_cast<uint16_t>(Number(at + 2, 2));
    entry.count = Number(at + 4, Word());
    entry.value = at + 4 + Word();
    const auto field = file_.subspan(entry.value, Word());
    entry.field.assign(field.begin(), field.end());
    const uint64_t each = DirectoryValueBytes(entry.type);
    // impossible count
    entry.size = each == 0 || entry.count > UINT64_MAX / 16 ? 0 : each * entry.count;
    entry.outside = entry.size > Word();
    if (entry.outside) entry.value = Number(entry.value, Word());
    return entry;
  }

  void MapAll() {
    for (uint64_t at = Number(FirstAt(), Word()); at != 0 && Map(at, 0);) at = mappedNext_;
    for (const Range& range : used_) {
      begins_.push_back(range.begin);
      ends_.push_back(range.end);
    }
    std::ranges::sort(begins_);
    std::ranges::sort(ends_);
  }

  // Records the ranges of the file used by a directory and its subdirectories. False if it was
  // already visited, or is not entirely within the file.
  bool Map(uint64_t at, int32_t depth) {
    Directory directory;
    if (visited_.size() >= limits.filePages || mappedEntries_ > limits.exifEntries) return false;
    const bool seen = !visited_.insert(at).second;
    shared_ = shared_ || seen;
    if (seen || !ReadDirectory(at, directory)) return false;
    mappedEntries_ += directory.oldCount;
    used_.push_back({at, directory.oldEnd});
    for (const Entry& entry : directory.entries) {
      if (entry.outside) Use(entry.value, entry.size);
      if (entry.tag == kGpsPointer) withGps_.push_back(at);
      MapBelow(entry, depth);
    }
    for (const auto& tags : kDataTags) MapData(directory, tags.offsets, tags.sizes);
    mappedNext_ = directory.next;
    return true;
  }

  void MapBelow(const Entry& entry, int32_t depth) {
    const bool leads = entry.tag == kExifPointer || entry.tag == kGpsPointer ||
                       entry.tag == kInteroperabilityPointer || entry.tag == kSubDirectories;
    if (!leads || depth >= kDeepest || entry.size == 0 || !Holds(entry.value, entry.size)) return;
    for (uint64_t i = 0; i < entry.count && pieces_ < kMostPieces; ++i, ++pieces_) {
      uint64_t at = NumberOf(entry, i);
      // subdirectories of a page may be chained; others are not
      while (at != 0 && Map(at, depth + 1)) at = entry.tag == kSubDirectories ? mappedNext_ : 0;
    }
  }

  void MapData(const Directory& directory, uint16_t offsetsTag, uint16_t sizesTag) {
    const auto find = [&](uint16_t tag) {
      const auto found = std::ranges::find(directory.entries, tag, &Entry::tag);
      return found == directory.entries.end() || !Holds(found->value, found->size) ? nullptr
                                                                                   : &*found;
    };
    const Entry *offsets = find(offsetsTag), *sizes = sizesTag == 0 ? nullptr : find(sizesTag);
    if (offsets == nullptr) return;
    for (uint64_t i = 0; i < offsets->count && pieces_ < kMostPieces; ++i, ++pieces_) {
      const uint64_t at = NumberOf(*offsets, i);
      const bool sized = sizes != nullptr && i < sizes->count;
      const uint64_t rest = file_.size() - std::min<uint64_t>(at, file_.size());
      uint64_t size = sized ? NumberOf(*sizes, i) : rest;
      // HD Photo writers count an alpha codestream from the start of the file
      if (offsetsTag >= kFirstHdpData) size = std::min(size, rest);
      if (at != 0) Use(at, size);
    }
  }

  void Use(uint64_t at, uint64_t size) {
    pointsBeyond_ = pointsBeyond_ || !Holds(at, size);
    if (at < file_.size()) used_.push_back({at, at + std::min<uint64_t>(size, file_.size() - at)});
  }

  // Whether a range has only one user.
  bool Exclusive(const Range& range) const {
    const auto begun = std::ranges::lower_bound(begins_, range.end) - begins_.begin();
    const auto ended = std::ranges::upper_bound(ends_, range.begin) - ends_.begin();
    return !shared_ && range.end <= file_.size() && pieces_ < kMostPieces && begun - ended == 1;
  }

  void Patch(uint64_t at, std::vector<uint8_t> bytes) {
    edit_.patches.push_back({at, std::move(bytes)});
  }
  void ReleaseValue(const Entry& entry) {
    if (entry.outside && Holds(entry.value, entry.size))
      released_.push_back({entry.value, entry.value + entry.size});
  }
  // Zeroes the released ranges, except for bytes that something else still uses.
  void EraseReleased() {
    if (shared_ || pieces_ >= kMostPieces) return;
    std::ranges::sort(used_);
    std::ranges::sort(released_);
    std::vector<Range> kept;
    std::ranges::set_difference(used_, released_, std::back_inserter(kept));
    auto next = kept.begin();
    uint64_t at = 0, keptEnd = 0;
    for (const Range& range : released_) {
      at = std::max(at, range.begin);
      while (at < range.end) {
        for (; next != kept.end() && next->begin <= at; ++next)
          keptEnd = std::max(keptEnd, next->end);
        const uint64_t end = next == kept.end() ? range.end : std::min(range.end, next->begin);
        if (keptEnd <= at) Patch(at, std::vector<uint8_t>(end - at));
        at = std::max(keptEnd, end);
      }
    }
  }

  // Appends bytes at an even offset, which is returned.
  uint64_t Append(const std::vector<uint8_t>& bytes) {
    if ((file_.size() + edit_.tail.size()) % 2 != 0) edit_.tail.push_back(0);
    const uint64_t at = file_.size() + edit_.tail.size();
    edit_.tail.insert(edit_.tail.end(), bytes.begin(), bytes.end());
    return at;
  }

  void Apply(const DirectoryChange& change, Directory& directory) {
    auto& entries = directory.entries;
    auto found = std::ranges::find(entries, change.tag, &Entry::tag);
    if (!change.entry) {
      const auto goes = [&](const Entry& entry) { return change.all || entry.tag == change.tag; };
      for (const Entry& entry : entries) {
        if (goes(entry)) ReleaseValue(entry);
      }
      directory.dirty = std::erase_if(entries, goes) > 0 || directory.dirty;
      return;
    }
    if (found != entries.end()) {
      // damaged directories have some twice
      const auto again =
          std::stable_partition(std::next(found), entries.end(),
                                [&](const Entry& entry) { return entry.tag != change.tag; });
      std::for_each(again, entries.end(), [&](const Entry& entry) { ReleaseValue(entry); });
      directory.dirty = directory.dirty || again != entries.end();
      entries.erase(again, entries.end());
    }
    std::vector<uint8_t> values = change.entry->value;
    if (bigEndian_) SwapExifNumbers(change.entry->type, values);
    if (found == entries.end()) {
      found = std::ranges::find_if(entries, [&](const Entry& e) { return e.tag > change.tag; });
      found = entries.insert(found, Entry{.tag = change.tag});
    } else if (IsSame(*found, *change.entry, values)) {
      return;
    }
    directory.dirty = true;
    SetValue(*found, *change.entry, std::move(values));
  }

  bool IsSame(const Entry& old, const ExifEntry& entry, const std::vector<uint8_t>& values) const {
    return old.type == entry.type && old.count == entry.count && Holds(old.value, old.size) &&
           std::ranges::equal(file_.subspan(old.value, old.size), values);
  }

  void SetValue(Entry& target, const ExifEntry& entry, std::vector<uint8_t> values) {
    const Range old{target.value, target.value + target.size};
    const bool fits = target.outside && values.size() > Word() && values.size() <= target.size &&
                      Holds(target.value, target.size) && Exclusive(old);
    if (fits) {
      values.resize(target.size);
      Patch(target.value, std::move(values));
    } else {
      ReleaseValue(target);
      if (values.size() > Word()) values = Bytes(Append(values), Word());
      values.resize(Word());
      target.field = std::move(values);
    }
    target.type = entry.type;
    target.count = entry.count;
    target.outside = false;  // its old value is no longer used
  }

  // The directory as stored in the file.
  std::vector<uint8_t> Laid(const Directory& directory) const {
    std::vector<uint8_t> bytes = Bytes(directory.entries.size(), CountBytes());
    const auto add = [&](const std::vector<uint8_t>& more) {
      bytes.insert(bytes.end(), more.begin(), more.end());
    };
    for (const Entry& entry : directory.entries) {
      add(Bytes(entry.tag, 2));
      add(Bytes(entry.type, 2));
      add(Bytes(entry.count, Word()));
      add(entry.field);
    }
    add(Bytes(directory.next, Word()));
    return bytes;
  }

  // Writes a changed directory in place, or at the end of the file; returns its offset. An empty
  // one is omitted (0) unless it is `needed`.
  uint64_t Place(const Directory& directory, bool needed) {
    const Range old{directory.at, directory.oldEnd};
    if (directory.entries.empty() && !needed) {
      released_.push_back(old);
      return 0;
    }
    const uint64_t most = wide_ ? limits.exifEntries : uint64_t{UINT16_MAX};
    overfull_ =
        overfull_ || directory.entries.size() > std::min<uint64_t>(most, limits.exifEntries);
    std::vector<uint8_t> bytes = Laid(directory);
    if (directory.at != 0 && bytes.size() <= old.end - old.begin && Exclusive(old)) {
      bytes.resize(old.end - old.begin);
      Patch(old.begin, std::move(bytes));
      return directory.at;
    }
    if (directory.at != 0) released_.push_back(old);
    return Append(bytes);
  }

  // Applies the changes for the directory an entry of the first one points to.
  Status EditSub(uint16_t pointerTag, ExifPlace place, std::span<const DirectoryChange> changes,
                 Directory& first) {
    const auto concerns = [&](const DirectoryChange& change) { return change.place == place; };
    if (std::ranges::none_of(changes, concerns)) return Status::Ok;
    const auto pointer = std::ranges::find(first.entries, pointerTag, &Entry::tag);
    Directory directory;
    const bool there = pointer != first.entries.end();
    if (there && !ReadDirectory(NumberOf(*pointer, 0), directory)) return Damaged();
    for (const DirectoryChange& change : changes) {
      if (concerns(change)) Apply(change, directory);
    }
    if (!directory.dirty) return Status::Ok;
    const uint64_t at = Place(directory, false);
    if (at == directory.at) return Status::Ok;
    DirectoryChange change{.tag = pointerTag};
    if (at != 0) {
      const uint16_t type = at > UINT32_MAX ? kLong8 : kLong;
      change.entry =
          ExifEntry{pointerTag, type, 1, std::vector<uint8_t>(DirectoryValueBytes(type))};
      for (size_t i = 0; i < change.entry->value.size(); ++i)
        change.entry->value[i] = static_cast<uint8_t>(at >> 8 * i);
    }
    Apply(change, first);
    return Status::Ok;
  }

  // Removes the GPS directories of pages and thumbnails after the first directory, if all of its
  // own go.
  Status ClearFurther(std::span<const DirectoryChange> changes, uint64_t firstAt) {
    const auto clears = [](const DirectoryChange& change) {
      return change.all && change.place == ExifPlace::Gps;
    };
    const auto change = std::ranges::find_if(changes, clears);
    if (change == changes.end()) return Status::Ok;
    std::ranges::sort(withGps_);
    withGps_.erase(std::unique(withGps_.begin(), withGps_.end()), withGps_.end());
    for (const uint64_t at : withGps_) {
      if (at == firstAt) continue;
      Directory page;
      if (!ReadDirectory(at, page)) return Damaged();
      RETURN_IF_BAD(EditSub(kGpsPointer, ExifPlace::Gps, {&*change, 1}, page));
      if (!page.dirty || Place(page, true) == at) continue;
      reason_ = Tr("The place shares its bytes with other values.");
      return Status::UnsuitableImage;
    }
    return Status::Ok;
  }

  Status CheckGrowth() {
    if (overfull_) return Damaged();
    if (edit_.tail.empty()) return Status::Ok;
    if (pointsBeyond_) {
      reason_ = Tr("Its directories point beyond their end, so nothing can be added safely.");
      return Status::UnsuitableImage;
    }
    if (!wide_ && file_.size() + edit_.tail.size() > UINT32_MAX) {
      reason_ = Tr("A file of this kind cannot be larger than 4 GB.");
      return Status::UnsuitableImage;
    }
    return Status::Ok;
  }

  DirectoryEdit& edit_;
  std::string& reason_;
  std::unordered_set<uint64_t> visited_;
  std::vector<Range> used_;              // one for each user of some bytes
  std::vector<uint64_t> begins_, ends_;  // of the used ranges, each sorted
  std::vector<Range> released_;          // used so far, by what was removed or moved
  std::vector<uint64_t> withGps_;        // directories that lead to a GPS directory
  uint64_t mappedNext_ = 0, mappedEntries_ = 0, pieces_ = 0;
  bool pointsBeyond_ = false;  // something refers to data past the end
  bool shared_ = false;        // a directory is reached twice: do not edit in place
  bool overfull_ = false;      // a directory would have more entries than can be counted
};

}  // namespace

void SwapExifNumbers(uint16_t type, std::span<uint8_t> values) {
  const size_t unit = DirectoryUnitBytes(type);
  if (unit < 2) return;
  for (size_t i = 0; i + unit <= values.size(); i += unit)
    std::reverse(values.begin() + static_cast<ptrdiff_t>(i),
                 values.begin() + static_cast<ptrdiff_t>(i + unit));
}

Status EditDirectories(std::span<const uint8_t> file, std::span<const DirectoryChange> changes,
                       DirectoryEdit& edit, std::string& reason) {
  return Editor(file, edit, reason).Run(changes);
}

std::vector<DirectoryValue> FindDirectoryValues(std::span<const uint8_t> file, uint16_t tag) {
  DirectoryEdit edit;
  std::string reason;
  return Editor(file, edit, reason).FindAll(tag);
}

DirectoryValue FirstDirectoryValue(std::span<const uint8_t> file, uint16_t tag) {
  DirectoryEdit edit;
  std::string reason;
  return Editor(file, edit, reason).FindFirst(tag);
}

void AddEdited(std::span<const uint8_t> file, DirectoryEdit edit, FilePieces& pieces) {
  uint64_t at = 0;
  for (DirectoryEdit::Patch& patch : edit.patches) {
    pieces.Keep(file.subspan(at, patch.at - at));
    at = patch.at + patch.bytes.size();
    pieces.Add(std::move(patch.bytes));
  }
  pieces.Keep(file.subspan(at));
  pieces.Add(std::move(edit.tail));
}

std::vector<uint8_t> EditedBlock(std::span<const uint8_t> block, DirectoryEdit edit) {
  FilePieces pieces;
  AddEdited(block, std::move(edit), pieces);
  return pieces.Joined();
}

}  // namespace fotomill
