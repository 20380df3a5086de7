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

// What is known of a picture file, so that it need not be decoded again. Good as long as the file
// has the size and time that it was computed for.
struct HashRecord {
  uint64_t size = 0;     // of the file, bytes
  int64_t modified = 0;  // seconds since 1970 UTC
  int32_t width = 0, height = 0;
  bool hasHashes = false;
  PictureHashes hashes{};
  std::string digest = {};  // of the pixels, 32 characters; empty unless asked for
};

// The store of picture hashes in the data folder: a file that is only ever appended to, and made
// anew when most of it is out of date. Little-endian:
//
//   offset size  content
//        0    8  magic "FMWHASH1"
//   then records, one after the other
//        0    4  bytes of the record, 120 + length of the path
//        4    4  sum of what follows (FNV-1a, 32 bits)
//        8    8  size of the file
//       16    8  its modification time, seconds since 1970 UTC
//       24    4  width, 4 height
//       32   64  eight hashes
//       96   16  digest of the pixels
//      112    4  bit 0: has hashes, bit 1: has a digest
//      116    4  0
//      120       absolute path
//
// The last record of a path counts. Reading ends at the first record that is cut short or whose sum
// is wrong: that of a program that was stopped while it wrote. Several programs may write at a
// time.
inline constexpr std::string_view kHashStoreName = "Fotomill.hashes";

// One store. Belongs to one thread.
class HashStore {
 public:
  // Reads the store. One that is missing is empty; one that cannot be read, or is something else,
  // is empty as well and will not be written.
  explicit HashStore(std::string path);

  // What is known of a file of that size and time; null if nothing is.
  const HashRecord* Find(const std::string& path, uint64_t size, int64_t modified) const;
  // Takes in what was found out; Save writes it. A file that was changed within the last two
  // seconds is not kept, as it may change again without a new time.
  void Put(const std::string& path, const HashRecord& record);
  // Appends what was taken in since the last time. False when it could not be written; it stays to
  // be written then.
  [[nodiscard]] bool Save();

 private:
  bool Load();
  bool Append();
  bool Rewrite(platform::Existing existing);
  uint64_t TakeRecords(std::span<const uint8_t> bytes);

  const std::string path_;
  platform::StoreFile file_;  // closed while there is none
  std::unordered_map<std::string, HashRecord> records_;
  std::unordered_map<std::string, HashRecord> unsaved_;
  uint64_t end_ = 0;     // of the records that are whole, in the file
  uint64_t parsed_ = 0;  // how many records the file has, replaced ones included
  bool writable_ = true;
};

}  // namespace fotomill
