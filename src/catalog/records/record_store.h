#pragma once

#include <cstdint>
#include <span>
#include <string>
#include <string_view>
#include <unordered_map>

#include "platform/output_file.h"
#include "platform/store_file.h"

namespace fotomill {

// What a store knows about a file. Valid as long as size and time of the file do not change.
struct StoredRecord {
  uint64_t size = 0;      // of the file, bytes
  int64_t modified = 0;   // seconds since 1970 UTC
  std::string data = {};  // any bytes; their meaning is the store's
};

// The layout of a store: an append-only file that is rewritten when most of it is outdated.
// Little-endian:
//
//   offset size  content
//        0    8  magic, which names the store and its version
//   followed by records
//        0    4  bytes of the record
//        4    4  checksum of the rest (FNV-1a, 32 bits)
//        8    8  size of the file
//       16    8  its modification time, seconds since 1970 UTC
//       24       the data, then the absolute path
//
// The last record of a path applies. Reading stops at the first record that is incomplete or has a
// wrong checksum, as left by an interrupted program. Several programs may write concurrently.
struct RecordLayout {
  std::string_view magic;  // 8 characters
  // bytes of data in each record; 0: 4 bytes of each record say how many follow
  uint32_t dataBytes = 0;
};

// A store of facts about files, by absolute path, in the data folder. Not thread-safe.
class RecordStore {
 public:
  // Loads the store. A missing store is empty, as is one that cannot be read, which is never
  // written. A file that is not such a store is renamed, to make room for a new one.
  RecordStore(std::string path, RecordLayout layout);

  // The record for a file with this size and time; null if there is none. Valid until the next Put
  // or Save.
  const StoredRecord* Find(const std::string& path, uint64_t size, int64_t modified) const;
  // Adds a record; Save writes it. Files modified within the last two seconds are ignored, as they
  // may change again without a new time. So are records over 1 MiB.
  void Put(const std::string& path, StoredRecord record);
  // Appends all records added since the last call. If writing fails, returns false and keeps them
  // for the next call.
  [[nodiscard]] bool Save();
  // Where Load moved a file that is not such a store; empty if it did not.
  const std::string& SetAside() const { return setAside_; }

 private:
  bool Load();
  bool MoveAside();
  bool CatchUp();
  bool Append();
  bool Rewrite(platform::Existing existing);
  uint64_t TakeRecords(std::span<const uint8_t> bytes);

  const std::string path_;
  const RecordLayout layout_;
  platform::StoreFile file_;  // closed if there is no file
  std::unordered_map<std::string, StoredRecord> records_;
  std::unordered_map<std::string, StoredRecord> unsaved_;
  uint64_t end_ = 0;     // end of the valid records in the file
  uint64_t parsed_ = 0;  // number of records in the file, including replaced ones
  bool writable_ = true;
  std::string setAside_;
};

}  // namespace fotomill
