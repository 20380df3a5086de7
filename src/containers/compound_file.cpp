// Compound files, little-endian, in sectors of 512 or 4096 bytes; sector 0 follows the header.
//
//   offset size  field
//        0    8  D0 CF 11 E0 A1 B1 1A E1
//       28    2  byte order, FFFE
//       30    2  sector size as a power of two, 9 or 12
//       32    2  the same of short sectors, 6
//       48    4  first sector of the directory
//       56    4  streams below this size, 4096, are in short sectors
//       60    4  first sector of the table of short sectors
//       68    8  first sector that continues the list below, and number of such sectors
//       76  436  the sectors of the sector table
//
// The sector table (FAT) has 4 bytes per sector: the next sector of the same stream, or FFFFFFFE
// and above at its end. The directory is such a chain of 128-byte entries:
//
//        0   64  name, UTF-16
//       64    2  its size in bytes, including the terminator
//       66    1  type: 1 storage, 2 stream, 5 root
//       68   12  left and right sibling in the tree of the storage, and the first child
//      116    8  first sector, size
//
// The root's stream consists of the short sectors.
// Source: Microsoft, [MS-CFB] Compound File Binary File Format.
#include "containers/compound_file.h"

#include <algorithm>

#include "core/byte_reader.h"

namespace fotomill {

namespace {

constexpr uint32_t kLastSector = 0xFFFFFFFA;  // higher values are special
constexpr uint64_t kEntryBytes = 128, kShortBytes = 64;
constexpr size_t kListInHeader = 109;
constexpr size_t kMostEntries = 65536;
constexpr uint8_t kNoKind = 0;

uint32_t Le32At(std::span<const uint8_t> bytes, uint64_t offset) {
  ByteReader reader(bytes);
  reader.Seek(offset);
  return reader.Le32();
}

}  // namespace

void CompoundStream::Append(std::span<const uint8_t> bytes) {
  const bool follows =
      !pieces_.empty() && pieces_.back().bytes.data() + pieces_.back().bytes.size() == bytes.data();
  if (follows) {
    Piece& last = pieces_.back();
    last.bytes = {last.bytes.data(), last.bytes.size() + bytes.size()};
  } else {
    pieces_.push_back({size_, bytes});
  }
  size_ += bytes.size();
}

std::span<const uint8_t> CompoundStream::Bytes(uint64_t offset, uint64_t count,
                                               std::vector<uint8_t>& gathered) const {
  if (offset > size_ || count > size_ - offset || count == 0) return {};
  if (!copy_.empty()) return std::span(copy_).subspan(offset, count);
  auto piece = std::ranges::upper_bound(pieces_, offset, {}, &Piece::at) - 1;
  if (offset - piece->at + count <= piece->bytes.size())
    return piece->bytes.subspan(offset - piece->at, count);
  gathered.clear();
  for (; gathered.size() < count; ++piece) {
    const auto rest = piece->bytes.subspan(offset + gathered.size() - piece->at);
    const auto part = rest.first(std::min<uint64_t>(rest.size(), count - gathered.size()));
    gathered.insert(gathered.end(), part.begin(), part.end());
  }
  return gathered;
}

std::span<const uint8_t> CompoundFile::Sector(uint32_t number) const {
  const uint64_t offset = (uint64_t{number} + 1) * sectorBytes_;
  if (number > kLastSector || offset >= file_.size()) return {};
  return file_.subspan(offset, std::min<uint64_t>(sectorBytes_, file_.size() - offset));
}

uint32_t CompoundFile::Next(uint32_t sector) const {
  const uint64_t each = sectorBytes_ / 4, table = sector / each;
  if (table >= tableSectors_.size()) return UINT32_MAX;
  const auto place = Sector(tableSectors_[table]).subspan(0);
  const uint64_t offset = sector % each * 4;
  return offset + 4 <= place.size() ? Le32At(place, offset) : UINT32_MAX;
}

CompoundStream CompoundFile::Chain(uint32_t first, uint64_t size) const {
  CompoundStream stream;
  for (uint32_t sector = first; stream.size_ < size && sector <= kLastSector;
       sector = Next(sector)) {
    const auto bytes = Sector(sector);
    if (bytes.empty()) break;
    stream.Append(bytes.first(std::min<uint64_t>(bytes.size(), size - stream.size_)));
    if (bytes.size() < sectorBytes_ || stream.size_ > file_.size()) break;  // a cycle
  }
  return stream;
}

CompoundStream CompoundFile::ShortChain(uint32_t first, uint64_t size) const {
  CompoundStream stream;
  std::vector<uint8_t> gathered;
  uint32_t sector = first;
  while (stream.copy_.size() < size && sector <= kLastSector) {
    const uint64_t offset = sector * kShortBytes;
    const uint64_t there = offset < shortSectors_.Size() ? shortSectors_.Size() - offset : 0;
    const uint64_t count = std::min({kShortBytes, there, size - stream.copy_.size()});
    const auto bytes = shortSectors_.Bytes(offset, count, gathered);
    if (bytes.empty()) break;
    stream.copy_.insert(stream.copy_.end(), bytes.begin(), bytes.end());
    const auto next = shortTable_.Bytes(uint64_t{sector} * 4, 4, gathered);
    sector = next.empty() ? UINT32_MAX : Le32At(next, 0);
  }
  stream.size_ = stream.copy_.size();
  return stream;
}

Status CompoundFile::ReadTables(uint32_t first, uint32_t count, std::span<const uint8_t> own) {
  const uint64_t most = file_.size() / sectorBytes_ + 1;
  const auto take = [&](std::span<const uint8_t> list, uint64_t entries) {
    for (uint64_t i = 0; i < entries && tableSectors_.size() < most; ++i) {
      const uint32_t sector = Le32At(list, 4 * i);
      if (sector > kLastSector) return;
      tableSectors_.push_back(sector);
    }
  };
  take(own, kListInHeader);
  uint32_t sector = first;
  for (uint64_t i = 0; i < std::min<uint64_t>(count, most) && sector <= kLastSector; ++i) {
    const auto list = Sector(sector);
    if (list.size() < sectorBytes_) return Status::FileReadError;
    take(list, sectorBytes_ / 4 - 1);
    sector = Le32At(list, sectorBytes_ - 4);
  }
  return Status::Ok;
}

Status CompoundFile::ReadDirectory(uint32_t first) {
  const CompoundStream directory =
      Chain(first, std::min<uint64_t>(file_.size(), kMostEntries * kEntryBytes));
  std::vector<uint8_t> gathered;
  for (uint64_t at = 0; at + kEntryBytes <= directory.Size(); at += kEntryBytes) {
    ByteReader bytes(directory.Bytes(at, kEntryBytes, gathered));
    Entry entry;
    const auto name = bytes.Take(64);
    const size_t characters = std::min<size_t>(bytes.Le16(), 64) / 2;
    for (size_t i = 0; i + 1 < characters; ++i)
      entry.name +=
          name[2 * i + 1] != 0 || name[2 * i] > 126 ? '?' : static_cast<char>(name[2 * i]);
    entry.kind = bytes.U8();
    bytes.Skip(1);
    for (int32_t* link : {&entry.left, &entry.right, &entry.child})
      *link = static_cast<int32_t>(bytes.Le32());
    bytes.Skip(36);
    entry.first = bytes.Le32();
    entry.size = bytes.Le32();
    entries_.push_back(entry);
  }
  return entries_.empty() ? Status::FileReadError : Status::Ok;
}

Status CompoundFile::Open(std::span<const uint8_t> file) {
  file_ = file;
  ByteReader bytes(file);
  const bool known = bytes.Match("\xd0\xcf\x11\xe0\xa1\xb1\x1a\xe1");
  if (!known) return Status::DamagedFile;
  bytes.Seek(28);
  const uint16_t order = bytes.Le16(), shift = bytes.Le16(), shortShift = bytes.Le16();
  bytes.Seek(48);
  const uint32_t directory = bytes.Le32();
  bytes.Skip(4);
  shortLimit_ = bytes.Le32();
  const uint32_t shortTable = bytes.Le32(), shortTables = bytes.Le32();
  const uint32_t list = bytes.Le32(), lists = bytes.Le32();
  const auto own = bytes.Take(4 * kListInHeader);
  if (!bytes.Ok()) return Status::FileReadError;
  if (order != 0xFFFE || (shift != 9 && shift != 12) || shortShift != 6 || shortLimit_ > 65536)
    return Status::DamagedFile;
  sectorBytes_ = uint64_t{1} << shift;
  RETURN_IF_BAD(ReadTables(list, lists, own));
  RETURN_IF_BAD(ReadDirectory(directory));
  const uint64_t tableBytes = uint64_t{shortTables} * sectorBytes_;
  shortTable_ = Chain(shortTable, std::min<uint64_t>(tableBytes, file.size()));
  shortSectors_ =
      Chain(entries_[kRoot].first, std::min<uint64_t>(entries_[kRoot].size, file.size()));
  return Status::Ok;
}

template <typename Fits>
int32_t CompoundFile::FindEntry(int32_t storage, Fits fits) const {
  const auto valid = [&](int32_t entry) {
    return entry >= 0 && static_cast<size_t>(entry) < entries_.size() &&
           entries_[static_cast<size_t>(entry)].kind != kNoKind;
  };
  if (!valid(storage)) return kNone;
  std::vector<int32_t> open = {entries_[static_cast<size_t>(storage)].child};
  // every entry is in one tree; more steps mean a cycle
  for (size_t steps = 0; !open.empty() && steps <= 2 * entries_.size(); ++steps) {
    const int32_t at = open.back();
    open.pop_back();
    if (!valid(at)) continue;
    const Entry& entry = entries_[static_cast<size_t>(at)];
    if (fits(entry.name)) return at;
    open.push_back(entry.right);
    open.push_back(entry.left);
  }
  return kNone;
}

int32_t CompoundFile::Find(int32_t storage, std::string_view name) const {
  return FindEntry(storage, [&](const std::string& candidate) { return candidate == name; });
}

int32_t CompoundFile::FindBeginning(int32_t storage, std::string_view beginning) const {
  return FindEntry(storage,
                   [&](const std::string& candidate) { return candidate.starts_with(beginning); });
}

CompoundStream CompoundFile::Stream(int32_t entry) const {
  if (entry < 0 || static_cast<size_t>(entry) >= entries_.size()) return {};
  const Entry& found = entries_[static_cast<size_t>(entry)];
  const uint64_t size = std::min<uint64_t>(found.size, file_.size());
  return size < shortLimit_ ? ShortChain(found.first, size) : Chain(found.first, size);
}

}  // namespace fotomill
