#pragma once

#include <cstdint>
#include <functional>
#include <optional>
#include <span>
#include <string>
#include <string_view>
#include <vector>

namespace fotomill {

// Finds the records of a thumbnail database by their paths without reading them: a hash of each,
// and a table of the hashes. It knows too much at times (two paths of one hash) but never too
// little, so that who looks a record up reads it and compares. Records are numbered as in the
// database; those that are deleted or hold no thumbnail are in no table.
//
// A large index is between two runs in a file beside the database, little-endian. It is a copy of
// what the database says: a file that is damaged or belongs to another state of the database counts
// for nothing, and may be deleted.
//
//   offset size      field
//        0    8      magic "FMTDBIX1"
//        8    8      count of records
//       16    8      size of the database
//       24    8      its modification time, nanoseconds since 1970
//       32    8      count of blocks
//       40    8      checksum of the fields before
//       48  512 x n  blocks: a checksum of this block and the one above, 8 bytes, and 63 cells:
//       hash of a record, and
//                    record + 1, or 0, 0; in order of records, from the block hash x n / 2^32 on
//
// So a single record is found by reading one block, and blocks of two different states are never
// taken for one file.
class ThumbnailIndex {
 public:
  // The state of a database file that an index belongs to.
  struct State {
    int64_t count = -1;  // -1: of none
    uint64_t size = 0;
    int64_t modified = 0;
    bool operator==(const State&) const = default;
  };

  // Paths that differ in their extension only have the same hash, which is never 0.
  static uint32_t HashOf(std::string_view path);

  // Forgets all records, and how many there are, those that cannot be found included.
  void Clear();
  size_t Count() const { return hashes_.size(); }  // those that cannot be found included
  // Takes in the next record: its hash, or 0 for one that cannot be found.
  void Append(uint32_t hash);
  // Gives a record another hash; 0 takes it out.
  void Change(size_t record, uint32_t hash);

  // Calls `take` with each record of a hash, in order, until it answers true; whether it did.
  template <typename Take>
  bool Find(uint32_t hash, Take take) const {
    for (size_t cell = Home(hash); !cells_.empty() && cells_[cell] != kFree; cell = Next(cell)) {
      const size_t record = cells_[cell] - 1;
      if (hashes_[record] == hash && take(record)) return true;
    }
    return false;
  }

  // Finds like Find, without loading, in a file; nullopt unless what was read of it is whole and of
  // that state.
  static std::optional<bool> FindInFile(const std::string& path, const State& state, uint32_t hash,
                                        const std::function<bool(size_t record)>& take);
  // Fills the index from a file. False, with the index empty, unless the file is whole and of that
  // state.
  bool Load(const std::string& path, const State& state);
  // Writes the file, over an older index only. Silent when that fails, as nothing is lost.
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

  std::vector<uint32_t> hashes_;  // of every record
  // Record + 1 in the first free cell from its hash's home on, so that records of one hash are met
  // in order; kFree ends the search. A power of two of them, at most half in use.
  std::vector<uint32_t> cells_;
  int shift_ = 63;
};

}  // namespace fotomill
