// TIFF files refer to everything by offset, so nothing is moved: directories are shortened in
// place, and whatever is no longer referenced is zeroed.
// Source: Adobe, "TIFF Revision 6.0" (1992); the libtiff project, "The BigTIFF Design".
#include <algorithm>
#include <string_view>
#include <unordered_set>

#include "containers/bare_file.h"
#include "containers/directory_bytes.h"
#include "core/byte_reader.h"
#include "core/limits.h"

namespace fotomill {

namespace {

// Tags that contain the picture or affect its appearance or size: those of TIFF 6.0
// except texts and dates, those for fax, tiles and JPEG, the color profile, and those of
// later compression schemes.
struct TagRange {
  uint32_t first, last;
};
constexpr TagRange kPicture[] = {
    {254, 259},     {262, 266},     {273, 274},     {277, 284},     {286, 288},
    {290, 293},     {296, 297},     {301, 301},     {317, 332},     {334, 334},
    {336, 347},     {512, 521},     {529, 532},     {559, 559},     {32995, 32998},
    {34675, 34675}, {34908, 34910}, {37439, 37439}, {50674, 50674},
    {0xBC01, 0xBCFF},  // HD Photo
};
constexpr uint32_t kOrientation = 274, kProfile = 34675, kXmp = 700, kIptc = 33723;
constexpr uint32_t kHdpOrientation = 0xBC02, kHdpOffset = 0xBCC0, kHdpSize = 0xBCC1;
constexpr uint32_t kHdpAlphaOffset = 0xBCC2, kHdpAlphaSize = 0xBCC3;
constexpr uint32_t kStripOffsets = 273, kStripSizes = 279, kTileOffsets = 324, kTileSizes = 325;
constexpr uint32_t kSubDirectories = 330, kJpegOffset = 513, kJpegSize = 514;
// offsets of the tables of old-style JPEG: quantization, and two kinds of Huffman tables
constexpr uint32_t kFirstJpegTables = 519, kLastJpegTables = 521;
constexpr uint64_t kMostJpegTable = 16 + 256;
constexpr uint32_t kExif = 34665, kGps = 34853, kInteroperability = 40965;
// Camera raw files need private tags and the maker note to be decoded.
constexpr uint32_t kPhotometric = 262, kDngVersion = 50706;
constexpr std::string_view kCr2 = "CR";
constexpr int32_t kDeepest = 4;            // nesting depth of directories
constexpr uint64_t kMostPieces = 1 << 23;  // strips and tiles of all pages

bool BelongsToPicture(uint32_t tag, const BareOptions& options) {
  if (tag == kOrientation || tag == kHdpOrientation) return options.orientation;
  if (tag == kProfile) return options.profile;
  if (tag == kXmp) return options.xmp;
  if (tag == kIptc) return options.iptc;
  return std::ranges::any_of(
      kPicture, [tag](const TagRange& range) { return tag >= range.first && tag <= range.last; });
}

// Bytes of the file, from `first` to before `end`.
struct Range {
  uint64_t first, end;
};

struct Entry {
  uint32_t tag = 0, type = 0;
  uint64_t count = 0;
  uint64_t start = 0;            // of the entry itself
  uint64_t value = 0, size = 0;  // offset and size of its values
  bool outside = false;          // outside the entry
};

class BareTiff : DirectoryBytes {
 public:
  BareTiff(std::span<const uint8_t> file, const BareOptions& options, std::vector<uint8_t>& bare)
      : DirectoryBytes(file), options_(options), bare_(bare) {}

  Status Make() {
    if (!ReadOrder()) return Status::DamagedFile;
    if (ByteReader(file_.subspan(std::min<size_t>(8, file_.size()))).Match(kCr2))
      return Status::UnsuitableImage;
    bare_.assign(file_.begin(), file_.end());
    Keep(0, FirstAt() + Word());
    RETURN_IF_BAD(TakeChain(Number(FirstAt(), Word()), 0));
    Erase();
    return Status::Ok;
  }

 private:
  void Keep(uint64_t at, uint64_t size) { kept_.push_back({at, at + size}); }
  // Limited to the file: a directory may end with it, without a link.
  void Drop(uint64_t at, uint64_t size) {
    dropped_.push_back({at, std::min<uint64_t>(at + size, file_.size())});
  }

  // Processes the chain of directories starting at `at`.
  Status TakeChain(uint64_t at, int32_t depth) {
    while (at != 0) {
      if (!visited_.insert(at).second || visited_.size() > limits.filePages)
        return Status::DamagedFile;
      RETURN_IF_BAD(TakeDirectory(at, depth));
      at = Number(next_, Word());
    }
    return Status::Ok;
  }

  // Reads the entries of a directory; `next_` is the offset after them.
  Status ReadEntries(uint64_t at, std::vector<Entry>& entries) {
    const uint64_t count = Number(at, CountBytes());
    if (!Holds(at, CountBytes())) return Status::FileReadError;
    if (count > limits.exifEntries - read_ || !Holds(at + CountBytes(), count * EntryBytes()))
      return Status::DamagedFile;
    read_ += count;
    for (uint64_t i = 0; i < count; ++i) {
      Entry entry{.start = at + CountBytes() + i * EntryBytes()};
      entry.tag = static_cast<uint32_t>(Number(entry.start, 2));
      entry.type = static_cast<uint32_t>(Number(entry.start + 2, 2));
      entry.count = Number(entry.start + 4, Word());
      entry.value = entry.start + 4 + Word();
      const uint64_t each = DirectoryValueBytes(entry.type);
      if (each != 0 && entry.count > file_.size() / each) return Status::DamagedFile;
      entry.size = each * entry.count;
      entry.outside = entry.size > Word();
      if (entry.outside) entry.value = Number(entry.value, Word());
      entries.push_back(entry);
    }
    next_ = at + CountBytes() + count * EntryBytes();
    return Status::Ok;
  }

  Status TakeDirectory(uint64_t at, int32_t depth) {
    std::vector<Entry> entries;
    RETURN_IF_BAD(ReadEntries(at, entries));
    if (std::ranges::any_of(entries, [&](const Entry& entry) { return IsRaw(entry); }))
      return Status::UnsuitableImage;
    if (!Holds(next_, Word())) return Status::FileReadError;
    const uint64_t end = next_, following = Number(next_, Word());
    uint64_t target = at + CountBytes();  // where the next kept entry goes
    for (const Entry& entry : entries) {
      if (!BelongsToPicture(entry.tag, options_)) {
        DropEntry(entry, 0);
        continue;
      }
      if (entry.outside && !Holds(entry.value, entry.size)) return Status::DamagedFile;
      if (entry.outside) Keep(entry.value, entry.size);
      std::copy_n(file_.begin() + static_cast<ptrdiff_t>(entry.start), EntryBytes(),
                  bare_.begin() + static_cast<ptrdiff_t>(target));
      target += EntryBytes();
    }
    RETURN_IF_BAD(KeepData(entries));
    PutNumber(at, (target - at) / EntryBytes(), CountBytes());
    PutNumber(target, following, Word());
    Keep(at, target + Word() - at);
    Drop(target + Word(), end - target);
    RETURN_IF_BAD(TakeSubDirectories(entries, depth));
    next_ = end;
    return Status::Ok;
  }

  bool IsRaw(const Entry& entry) const {
    constexpr uint64_t kColorFilters = 32803, kLinearRaw = 34892;
    if (entry.tag == kDngVersion) return true;
    if (entry.tag != kPhotometric || entry.count != 1 || entry.outside) return false;
    const uint64_t kind = NumberOf(entry, 0);
    return kind == kColorFilters || kind == kLinearRaw;
  }

  void PutNumber(uint64_t at, uint64_t number, uint64_t size) {
    Store(number, std::span(bare_).subspan(at, size));
  }

  // Drops an entry with its values and the directory it points to.
  void DropEntry(const Entry& entry, int32_t depth) {
    if (entry.outside && Holds(entry.value, entry.size)) Drop(entry.value, entry.size);
    const bool pointer = entry.tag == kExif || entry.tag == kGps || entry.tag == kInteroperability;
    const uint64_t at = Number(entry.value, entry.size);
    if (!pointer || entry.outside || at == 0 || depth >= kDeepest) return;
    if (!visited_.insert(at).second) return;
    std::vector<Entry> entries;
    if (ReadEntries(at, entries) != Status::Ok) return;
    Drop(at, CountBytes() + entries.size() * EntryBytes() + Word());
    for (const Entry& inner : entries) DropEntry(inner, depth + 1);
  }

  uint64_t NumberOf(const Entry& entry, uint64_t i) const {
    return Element(entry.value, entry.type, i);
  }

  // Marks the strips and tiles as used. Those beyond the end of the file are ignored.
  // UnsupportedFormat if their number is absurd.
  Status KeepData(const std::vector<Entry>& entries) {
    const auto find = [&](uint32_t tag) {
      const auto found = std::ranges::find(entries, tag, &Entry::tag);
      return found == entries.end() || found->size == 0 ? nullptr : &*found;
    };
    for (const auto& [offsets, sizes] : {std::pair(find(kStripOffsets), find(kStripSizes)),
                                         std::pair(find(kTileOffsets), find(kTileSizes)),
                                         std::pair(find(kJpegOffset), find(kJpegSize)),
                                         std::pair(find(kHdpOffset), find(kHdpSize)),
                                         std::pair(find(kHdpAlphaOffset), find(kHdpAlphaSize))}) {
      if (offsets == nullptr) continue;
      pieces_ += offsets->count;
      if (pieces_ > kMostPieces) return Status::UnsupportedFormat;
      for (uint64_t i = 0; i < offsets->count; ++i) {
        const uint64_t at = NumberOf(*offsets, i);
        // without a size: to the end of the file
        const bool sized = sizes != nullptr && i < sizes->count;
        const uint64_t size = sized ? NumberOf(*sizes, i) : file_.size();
        if (at < file_.size()) Keep(at, std::min(size, file_.size() - at));
      }
    }
    for (const Entry& entry : entries) {
      if (entry.tag < kFirstJpegTables || entry.tag > kLastJpegTables || entry.size == 0) continue;
      for (uint64_t i = 0; i < entry.count; ++i) {
        const uint64_t at = NumberOf(entry, i);
        if (at < file_.size()) Keep(at, std::min(kMostJpegTable, file_.size() - at));
      }
    }
    return Status::Ok;
  }

  Status TakeSubDirectories(const std::vector<Entry>& entries, int32_t depth) {
    for (const Entry& entry : entries) {
      if (entry.tag != kSubDirectories || entry.size == 0) continue;
      if (depth >= kDeepest) return Status::DamagedFile;
      pieces_ += entry.count;
      if (pieces_ > kMostPieces) return Status::DamagedFile;
      for (uint64_t i = 0; i < entry.count; ++i)
        RETURN_IF_BAD(TakeChain(NumberOf(entry, i), depth + 1));
    }
    return Status::Ok;
  }

  // Sorts and merges overlapping ranges.
  static void Merge(std::vector<Range>& ranges) {
    std::ranges::sort(ranges, {}, &Range::first);
    size_t last = 0;
    for (const Range& range : ranges) {
      if (range.first <= ranges[last].end) {
        ranges[last].end = std::max(ranges[last].end, range.end);
      } else {
        ranges[++last] = range;
      }
    }
    if (!ranges.empty()) ranges.resize(last + 1);
  }

  // Zeroes what was dropped and is not used elsewhere, and truncates the file.
  void Erase() {
    Merge(kept_);
    Merge(dropped_);
    auto next = kept_.begin();  // the first kept range that ends after the current offset
    for (const Range& range : dropped_) {
      for (uint64_t at = range.first; at < range.end;) {
        while (next != kept_.end() && next->end <= at) ++next;
        const uint64_t end = next == kept_.end() ? range.end : std::min(range.end, next->first);
        for (; at < end; ++at) bare_[at] = 0;
        if (next != kept_.end() && at >= next->first) at = next->end;
      }
    }
    if (!kept_.empty() && kept_.back().end < bare_.size()) bare_.resize(kept_.back().end);
  }

  const BareOptions& options_;
  std::vector<uint8_t>& bare_;
  uint64_t next_ = 0;    // offset after the entries of the last directory
  uint64_t read_ = 0;    // entries so far
  uint64_t pieces_ = 0;  // strips and tiles so far
  std::unordered_set<uint64_t> visited_;
  std::vector<Range> kept_, dropped_;
};

}  // namespace

Status MakeBareTiff(std::span<const uint8_t> file, std::vector<uint8_t>& bare) {
  return MakeBareTiff(file, {}, bare);
}

Status MakeBareTiff(std::span<const uint8_t> file, const BareOptions& options,
                    std::vector<uint8_t>& bare) {
  return BareTiff(file, options, bare).Make();
}

}  // namespace fotomill
