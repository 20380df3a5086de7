#include "catalog/thumbnail_index.h"

#include <algorithm>
#include <bit>
#include <cstring>

#include "core/byte_reader.h"
#include "platform/file_view.h"
#include "platform/paths.h"
#include "platform/store_file.h"

namespace fotomill {

namespace {

constexpr std::string_view kMagic = "FMTDBIX1";
constexpr size_t kStateSize = 32, kHeadSize = 40;
constexpr size_t kSmallestTable = 1024;  // cells
constexpr uint64_t kFactor = 0x9E3779B97F4A7C15;

// Four sums side by side over 8 bytes at a time; what is left over is filled with zeros.
uint64_t ChecksumOf(std::span<const uint8_t> bytes, uint64_t sum) {
  uint64_t sums[4] = {sum, kFactor, ~sum, bytes.size()};
  uint8_t last[32] = {};
  for (; !bytes.empty(); bytes = bytes.subspan(std::min(bytes.size(), sizeof last))) {
    const uint8_t* from = bytes.data();
    if (bytes.size() < sizeof last) from = static_cast<const uint8_t*>(std::memcpy(last, from, bytes.size()));
    for (size_t i = 0; i < 4; ++i) {
      uint64_t word;
      std::memcpy(&word, from + 8 * i, sizeof word);
      sums[i] = std::rotl((sums[i] ^ word) * kFactor, 29);
    }
  }
  return ((sums[0] * kFactor ^ sums[1]) * kFactor ^ sums[2]) * kFactor ^ sums[3];
}

uint64_t FileChecksum(std::span<const uint8_t> file) {
  return ChecksumOf(file.subspan(kHeadSize), ChecksumOf(file.first(kStateSize), 0));
}

void PutLe(std::vector<uint8_t>& bytes, uint64_t value, int count) {
  for (int i = 0; i < count; ++i) bytes.push_back(static_cast<uint8_t>(value >> (8 * i)));
}

// Whether a name may be taken for an index: there is an older one, or nothing yet. The file is then open.
bool OpenForSaving(const std::string& path, platform::StoreFile& file) {
  using platform::StoreFile;
  const StoreFile::OpenResult result = file.Open(path, StoreFile::Mode::ReadWrite);
  if (result == StoreFile::OpenResult::Missing)
    return file.Open(path, StoreFile::Mode::CreateNew) == StoreFile::OpenResult::Done;
  std::vector<uint8_t> magic(kMagic.size());
  return result == StoreFile::OpenResult::Done &&
         (file.Size() == 0 || (file.ReadAt(0, magic) && ByteReader(magic).Match(kMagic)));
}

}  // namespace

uint32_t ThumbnailIndex::HashOf(std::string_view path) {
  const std::string_view name = path.substr(0, path.size() - platform::SplitPath(path).extension.size());
  uint64_t hash = 0xcbf29ce484222325;  // FNV-1a
  for (const char c : name) hash = (hash ^ static_cast<unsigned char>(c)) * 0x100000001b3;
  return std::max<uint32_t>(1, static_cast<uint32_t>(hash ^ hash >> 32));
}

void ThumbnailIndex::Clear() {
  hashes_.clear();
  cells_.clear();
}

void ThumbnailIndex::Append(uint32_t hash) {
  hashes_.push_back(hash);
  if (hashes_.size() > cells_.size() / 2) return MakeTable(2 * hashes_.size());
  if (hash != 0) Insert(hashes_.size() - 1);
}

void ThumbnailIndex::Change(size_t record, uint32_t hash) {
  if (hashes_[record] == hash) return;
  if (hash == 0) {
    Remove(record);
    hashes_[record] = 0;
    return;
  }
  // A record in the middle gets another name, as good as never: only all over again, each hash has its records in
  // order.
  hashes_[record] = hash;
  MakeTable(hashes_.size());
}

void ThumbnailIndex::Insert(size_t record) {
  size_t cell = Home(hashes_[record]);
  while (cells_[cell] != kFree) cell = Next(cell);
  cells_[cell] = static_cast<uint32_t>(record + 1);
}

// Takes a record out of the table; those behind it that may come nearer to their homes do.
void ThumbnailIndex::Remove(size_t record) {
  size_t hole = Home(hashes_[record]);
  while (cells_[hole] != record + 1) {
    if (cells_[hole] == kFree) return;
    hole = Next(hole);
  }
  const size_t mask = cells_.size() - 1;
  for (size_t cell = Next(hole); cells_[cell] != kFree; cell = Next(cell)) {
    const size_t home = Home(hashes_[cells_[cell] - 1]);
    if (((cell - home) & mask) < ((cell - hole) & mask)) continue;  // its home lies behind the hole
    cells_[hole] = cells_[cell];
    hole = cell;
  }
  cells_[hole] = kFree;
}

void ThumbnailIndex::MakeTable(size_t records) {
  const size_t size = std::bit_ceil(std::max(2 * records, kSmallestTable));
  shift_ = 64 - std::countr_zero(size);
  cells_.assign(size, kFree);
  for (size_t i = 0; i < hashes_.size(); ++i) {
    if (hashes_[i] != 0) Insert(i);
  }
}

bool ThumbnailIndex::Load(const std::string& path, const State& state) {
  Clear();
  platform::FileView file;
  if (state.count < 0 || !file.Open(path)) return false;
  const std::span<const uint8_t> bytes = file.Bytes();
  const auto count = static_cast<size_t>(state.count);
  ByteReader reader(bytes);
  if (!reader.Match(kMagic)) return false;
  const State saved{static_cast<int64_t>(reader.Le64()), reader.Le64(), static_cast<int64_t>(reader.Le64())};
  const uint64_t checksum = reader.Le64();
  const std::span<const uint8_t> list = reader.Take(uint64_t{count} * 4);
  if (!reader.Ok() || saved != state || checksum != FileChecksum(bytes.first(kHeadSize + list.size()))) return false;
  ByteReader hashes(list);
  hashes_.reserve(count);
  for (size_t i = 0; i < count; ++i) hashes_.push_back(hashes.Le32());
  if (!file.Intact()) {
    Clear();
    return false;
  }
  MakeTable(count);
  return true;
}

void ThumbnailIndex::Save(const std::string& path, const State& state) const {
  std::vector<uint8_t> bytes(kMagic.begin(), kMagic.end());
  bytes.reserve(kHeadSize + 4 * hashes_.size());
  PutLe(bytes, static_cast<uint64_t>(state.count), 8);
  PutLe(bytes, state.size, 8);
  PutLe(bytes, static_cast<uint64_t>(state.modified), 8);
  PutLe(bytes, 0, 8);
  for (const uint32_t hash : hashes_) PutLe(bytes, hash, 4);
  const uint64_t checksum = FileChecksum(bytes);
  for (size_t i = 0; i < 8; ++i) bytes[kStateSize + i] = static_cast<uint8_t>(checksum >> (8 * i));
  platform::StoreFile file;
  // In place and unsynced, as what a crash or another process makes of it shows in the checksum.
  if (OpenForSaving(path, file)) (void)file.WriteAt(0, bytes);
}

}  // namespace fotomill
