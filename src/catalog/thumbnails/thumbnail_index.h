#pragma once

#include <cstdint>
#include <functional>
#include <optional>
#include <span>
#include <string>
#include <string_view>
#include <vector>

namespace fotomill {

// Finds records of a thumbnail database by path without reading them: a hash per record, and a hash
// table. It may find too many (paths with equal hashes) but never too few, so callers read the
// records found and compare. Records are numbered as in the database; deleted records and those
// without thumbnail are not in the table.
//
// A large index is stored between runs in a file beside the database, little-endian. It contains no
// additional data: a file that is damaged or belongs to another state of the database is ignored,
// and can be deleted.
//
//   offset size      field
//        0    8      magic "FMTDBIX1"
//        8    8      count of records
//       16    8      size of the database
//       24    8      its modification time, nanoseconds since 1970
//       32    8      count of blocks
//       40    8      checksum of the fields before
//       48  512 x n  blocks: an 8-byte checksum of the block, seeded with the one above, and 63
//                    cells: hash of a record, and record + 1, or 0, 0; ordered by record,
//                    starting in block hash x n / 2^32
//
// So a record is found by reading a single block,
// and blocks of different states are never mixed.
class ThumbnailIndex {
 public:
  // The state of a database file for which an index was made.
  struct State {
    int64_t count = -1;  // -1: none
    uint64_t size = 0;
    int64_t modified = 0;
    bool operator==(const State&) const = default;
  };

  // Paths that differ only in their extension have the same hash, which is never 0.
  static uint32_t HashOf(std::string_view path);

  // Removes all records.
  void Clear();
  size_t Count() const { return hashes_.size(); }  // including those that cannot be found
  // Adds the next record: its hash, or 0 if it cannot be found.
  void Append(uint32_t hash);
  // Changes the hash of a record; 0 removes it from the table.
  void Change(size_t record, uint32_t hash);

  // Calls `take` with each record of this hash, in order, until it returns true; whether it did.
  template <typename Take>
  bool Find(uint32_t hash, Take take) const {
    for (size_t cell = Home(hash); !cells_.empty() && cells_[cell] != kFree; cell = Next(cell)) {
      const size_t record = cells_[cell] - 1;
      if (hashes_[record] == hash && take(record)) return true;
    }
    return false;
  }

  // As Find, but directly in a file, without loading it; nullopt if the part read is damaged or
  // belongs to another state.
  static std::optional<bool> FindInFile(const std::string& path, const State& state, uint32_t hash,
                                        const std::function<bool(size_t record)>& take);
  // Loads the index from a file. False, with the index empty, if the file is damaged or belongs to
  // another state.
  bool Load(const std::string& path, const State& state);
  // Writes the file, replacing only an older index. Errors are ignored, as nothing is lost.
  void Save(const std::string& path, const State& state) const;

 private:
  static constexpr uint32_t kFree = 0;

  size_t Home(uint32_t hash) const {
    return static_cast<size_t>((hash * uint64_t{0x9E3779B97F4A7C15}) >> shift_);
  }
  size_t Next(size_t cell) const { return (cell + 1) & (cells_.size() - 1); }
  void Insert(size_t record);
  void Remove(size_t record);
  void MakeTable(size_t records);

  std::vector<uint32_t> hashes_;  // of all records
  // Record + 1 in the first free cell from its hash's home, so records with the same hash are found
  // in order; kFree ends a search. Size is a power of two, at most half used.
  std::vector<uint32_t> cells_;
  int shift_ = 63;
};

}  // namespace fotomill
