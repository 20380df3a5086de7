#pragma once

#include <array>
#include <cstdint>
#include <span>
#include <string>
#include <string_view>
#include <vector>

#include "core/status.h"

namespace fotomill {

// A stream of a compound file, as views into the file; short ones are copied. The file must remain.
class CompoundStream {
 public:
  uint64_t Size() const { return size_; }  // available bytes
  // `count` bytes from `offset`: a view into the file if they are contiguous, else copied to
  // `gathered`. Empty past the end.
  std::span<const uint8_t> Bytes(uint64_t offset, uint64_t count,
                                 std::vector<uint8_t>& gathered) const;

 private:
  friend class CompoundFile;
  // Contiguous sectors.
  struct Piece {
    uint64_t at = 0;  // offset in the stream
    std::span<const uint8_t> bytes = {};
  };
  void Append(std::span<const uint8_t> bytes);

  std::vector<Piece> pieces_;
  std::vector<uint8_t> copy_;
  uint64_t size_ = 0;
};

// A compound file: storages and streams, like folders and files. Names are reduced to ASCII; other
// characters become '?'.
class CompoundFile {
 public:
  static constexpr int32_t kRoot = 0, kNone = -1;

  // `file` must outlive this object. DamagedFile if it is not a compound file, FileReadError if its
  // structure is truncated.
  Status Open(std::span<const uint8_t> file);
  // The entry with that name in a storage, or the first with that prefix; kNone if not found.
  int32_t Find(int32_t storage, std::string_view name) const;
  int32_t FindBeginning(int32_t storage, std::string_view beginning) const;
  // A stream's contents; parts missing in the file are left out. Empty for kNone.
  CompoundStream Stream(int32_t entry) const;

 private:
  struct Entry {
    std::string name;
    uint8_t kind = 0;  // 1 storage, 2 stream, 5 root
    int32_t left = kNone, right = kNone, child = kNone;
    uint32_t first = 0;  // sector
    uint64_t size = 0;
  };

  Status ReadTables(uint32_t first, uint32_t count, std::span<const uint8_t> own);
  Status ReadDirectory(uint32_t first);
  std::span<const uint8_t> Sector(uint32_t number) const;
  uint32_t Next(uint32_t sector) const;
  CompoundStream Chain(uint32_t first, uint64_t size) const;
  CompoundStream ShortChain(uint32_t first, uint64_t size) const;
  template <typename Fits>
  int32_t FindEntry(int32_t storage, Fits fits) const;

  std::span<const uint8_t> file_;
  uint64_t sectorBytes_ = 512;
  std::vector<uint32_t> tableSectors_;  // the sectors of the sector table
  std::vector<Entry> entries_;
  uint64_t shortLimit_ = 4096;  // smaller streams are in short sectors
  CompoundStream shortTable_, shortSectors_;
};

}  // namespace fotomill
