#include "catalog/thumbnails/thumbnail_index.h"

#include <algorithm>
#include <array>
#include <bit>

#include "core/byte_reader.h"
#include "platform/file_view.h"
#include "platform/paths.h"
#include "platform/store_file.h"

namespace fotomill {

namespace {

constexpr std::string_view kMagic = "FMTDBIX1";
constexpr size_t kHeadSize = 48, kBlockSize = 512, kCellSize = 8;
// average fill; a free cell ends a search
constexpr size_t kCellsInBlock = kBlockSize / kCellSize - 1, kCellsUsed = 40;
constexpr size_t kSmallestTable = 1024;                                        // cells
constexpr uint64_t kFactor = 0x9E3779B97F4A7C15;

uint64_t WordAt(const uint8_t* bytes) {
  uint64_t word = 0;
  for (int i = 0; i < 8; ++i) word |= uint64_t{bytes[i]} << (8 * i);
  return word;
}

void PutWord(uint8_t* bytes, uint64_t word) {
  for (int i = 0; i < 8; ++i) bytes[i] = static_cast<uint8_t>(word >> (8 * i));
}

// Whole words only; computes two interleaved sums.
uint64_t ChecksumOf(std::span<const uint8_t> bytes, uint64_t sum) {
  uint64_t other = ~sum;
  for (size_t i = 0; i + 8 <= bytes.size(); i += 8) {
    uint64_t& target = i % 16 == 0 ? sum : other;
    target = std::rotl((target ^ WordAt(&bytes[i])) * kFactor, 29);
  }
  return (sum ^ std::rotl(other, 32)) * kFactor;
}

struct Head {
  uint64_t blocks = 0, checksum = 0;
};

using HeadBytes = std::array<uint8_t, kHeadSize>;

HeadBytes BytesOf(const ThumbnailIndex::State& state, uint64_t blocks) {
  HeadBytes bytes;
  std::ranges::copy(kMagic, bytes.begin());
  PutWord(&bytes[8], static_cast<uint64_t>(state.count));
  PutWord(&bytes[16], state.size);
  PutWord(&bytes[24], static_cast<uint64_t>(state.modified));
  PutWord(&bytes[32], blocks);
  PutWord(&bytes[40], ChecksumOf(std::span(bytes).first(40), 0));
  return bytes;
}

// False unless the bytes match this state.
bool ReadHead(std::span<const uint8_t, kHeadSize> bytes, const ThumbnailIndex::State& state,
              Head& head) {
  head = {WordAt(&bytes[32]), WordAt(&bytes[40])};
  return std::ranges::equal(bytes, BytesOf(state, head.blocks)) && head.blocks > 0;
}

uint64_t HomeBlock(uint32_t hash, uint64_t blocks) {
  return static_cast<uint64_t>(hash) * blocks >> 32;
}

uint64_t BlockChecksum(const uint8_t* block, uint64_t number, const Head& head) {
  return ChecksumOf({block + 8, kBlockSize - 8}, head.checksum + number * kFactor);
}

struct Cell {
  uint32_t hash = 0;
  uint32_t record = 0;  // + 1; 0: a free cell
};
Cell CellAt(const uint8_t* block, size_t place) {
  const uint64_t word = WordAt(block + kCellSize * (1 + place));
  return {static_cast<uint32_t>(word), static_cast<uint32_t>(word >> 32)};
}

// Opens the file of an index for writing: an existing index, or a new file. False if the name is
// taken by another file.
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
  const std::string_view name =
      path.substr(0, path.size() - platform::SplitPath(path).extension.size());
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
  // Rare: a record in the middle gets another path. Rebuild the table, so that records with the
  // same hash stay in order.
  hashes_[record] = hash;
  MakeTable(hashes_.size());
}

void ThumbnailIndex::Insert(size_t record) {
  size_t cell = Home(hashes_[record]);
  while (cells_[cell] != kFree) cell = Next(cell);
  cells_[cell] = static_cast<uint32_t>(record + 1);
}

// Removes a record from the table and moves later ones closer to their home cells.
void ThumbnailIndex::Remove(size_t record) {
  size_t hole = Home(hashes_[record]);
  while (cells_[hole] != record + 1) {
    if (cells_[hole] == kFree) return;
    hole = Next(hole);
  }
  const size_t mask = cells_.size() - 1;
  for (size_t cell = Next(hole); cells_[cell] != kFree; cell = Next(cell)) {
    const size_t home = Home(hashes_[cells_[cell] - 1]);
    if (((cell - home) & mask) < ((cell - hole) & mask)) continue;  // its home is after the hole
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

std::optional<bool> ThumbnailIndex::FindInFile(const std::string& path, const State& state,
                                               uint32_t hash,
                                               const std::function<bool(size_t record)>& take) {
  platform::StoreFile file;
  HeadBytes headBytes;
  Head head;
  if (state.count < 0 ||
      file.Open(path, platform::StoreFile::Mode::Read) != platform::StoreFile::OpenResult::Done)
    return {};
  if (!file.ReadAt(0, headBytes) || !ReadHead(headBytes, state, head)) return {};
  std::array<uint8_t, kBlockSize> block;
  for (uint64_t i = 0, number = HomeBlock(hash, head.blocks); i < head.blocks;
       ++i, number = (number + 1) % head.blocks) {
    if (!file.ReadAt(kHeadSize + number * kBlockSize, block)) return {};
    if (WordAt(block.data()) != BlockChecksum(block.data(), number, head)) return {};
    for (size_t place = 0; place < kCellsInBlock; ++place) {
      const Cell cell = CellAt(block.data(), place);
      if (cell.record == 0) return false;
      if (cell.hash != hash) continue;
      if (cell.record > static_cast<uint64_t>(state.count)) return {};
      if (take(cell.record - 1)) return true;
    }
  }
  return false;
}

bool ThumbnailIndex::Load(const std::string& path, const State& state) {
  Clear();
  platform::FileView file;
  Head head;
  if (state.count < 0 || !file.Open(path)) return false;
  const std::span<const uint8_t> bytes = file.Bytes();
  if (bytes.size() < kHeadSize || !ReadHead(bytes.first<kHeadSize>(), state, head)) return false;
  if (head.blocks > (bytes.size() - kHeadSize) / kBlockSize) return false;
  hashes_.assign(static_cast<size_t>(state.count), 0);
  bool whole = true;
  for (uint64_t number = 0; whole && number < head.blocks; ++number) {
    const uint8_t* const block = &bytes[kHeadSize + number * kBlockSize];
    whole = WordAt(block) == BlockChecksum(block, number, head);
    for (size_t place = 0; whole && place < kCellsInBlock; ++place) {
      const Cell cell = CellAt(block, place);
      if (cell.record == 0) break;
      whole = cell.record <= hashes_.size() && cell.hash != 0;
      if (whole) hashes_[cell.record - 1] = cell.hash;
    }
  }
  if (!whole || !file.Intact()) {
    Clear();
    return false;
  }
  MakeTable(hashes_.size());
  return true;
}

void ThumbnailIndex::Save(const std::string& path, const State& state) const {
  const uint64_t count = hashes_.size() / kCellsUsed + 1;
  const HeadBytes headBytes = BytesOf(state, count);
  const Head head{count, WordAt(&headBytes[40])};
  std::vector<uint8_t> blocks(count * kBlockSize), used(count);
  for (size_t i = 0; i < hashes_.size(); ++i) {
    if (hashes_[i] == 0) continue;
    uint64_t number = HomeBlock(hashes_[i], count);
    while (used[number] == kCellsInBlock) number = (number + 1) % count;
    PutWord(&blocks[number * kBlockSize + kCellSize * ++used[number]],
            hashes_[i] | uint64_t{i + 1} << 32);
  }
  for (uint64_t number = 0; number < count; ++number) {
    uint8_t* const block = &blocks[number * kBlockSize];
    PutWord(block, BlockChecksum(block, number, head));
  }
  platform::StoreFile file;
  // In place and without sync, as checksums detect damage by crashes or other processes.
  if (OpenForSaving(path, file)) (void)file.WriteAt(0, headBytes, blocks);
}

}  // namespace fotomill
