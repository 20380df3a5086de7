#pragma once

#include <cstdint>
#include <span>
#include <string>
#include <string_view>
#include <unordered_map>

#include "catalog/similar/picture_hash.h"
#include "platform/output_file.h"
#include "platform/store_file.h"

namespace fotomill {

// Cached results for a picture file, so that it need not be decoded again. Valid as long as size
// and time of the file do not change.
struct HashRecord {
  uint64_t size = 0;     // of the file, bytes
  int64_t modified = 0;  // seconds since 1970 UTC
  int32_t width = 0, height = 0;
  bool hasHashes = false;
  PictureHashes hashes{};
  std::string digest = {};  // of the pixels, 32 characters; empty if not computed
};

// The store of picture hashes in the data folder: an append-only file that is rewritten when most
// of it is outdated. Little-endian:
//
//   offset size  content
//        0    8  magic "FMWHASH1"
//   followed by records
//        0    4  bytes of the record, 120 + length of the path
//      4    4  checksum of the rest (FNV-1a, 32 bits)
//        8    8  size of the file
//       16    8  its modification time, seconds since 1970 UTC
//     24    8  width and height, 4 bytes each
//       32   64  eight hashes
//       96   16  digest of the pixels
//      112    4  bit 0: has hashes, bit 1: has a digest
//      116    4  0
//      120       absolute path
//
// The last record of a path applies. Reading stops at the first
// record that is incomplete or has a wrong checksum, as left by an
// interrupted program. Several programs may write concurrently.
inline constexpr std::string_view kHashStoreName = "Fotomill.hashes";

// A store. Not thread-safe.
class HashStore {
 public:
  // Loads the store. A missing store is empty; if it cannot be read or is not valid, it is empty
  // and never written.
  explicit HashStore(std::string path);

  // The record for a file with this size and time; null if there is none.
  const HashRecord* Find(const std::string& path, uint64_t size, int64_t modified) const;
  // Adds a record; Save writes it. Files modified within the last two seconds are ignored, as they
  // may change again without a new time.
  void Put(const std::string& path, const HashRecord& record);
  // Appends all records added since the last call. If writing fails, returns false and keeps them
  // for the next call.
  [[nodiscard]] bool Save();

 private:
  bool Load();
  bool Append();
  bool Rewrite(platform::Existing existing);
  uint64_t TakeRecords(std::span<const uint8_t> bytes);

  const std::string path_;
  platform::StoreFile file_;  // closed if there is no file
  std::unordered_map<std::string, HashRecord> records_;
  std::unordered_map<std::string, HashRecord> unsaved_;
  uint64_t end_ = 0;     // end of the valid records in the file
  uint64_t parsed_ = 0;  // number of records in the file, including replaced ones
  bool writable_ = true;
};

}  // namespace fotomill
