#pragma once

#include <cstdint>
#include <optional>
#include <string>
#include <string_view>

#include "catalog/records/record_store.h"
#include "catalog/similar/picture_hash.h"

namespace fotomill {

// Cached results for a picture file, so that it need not be decoded again. Valid as long as size
// and time of the file do not change.
struct HashRecord {
  uint64_t size = 0;     // of the file, bytes
  int64_t modified = 0;  // seconds since 1970 UTC
  int32_t width = 0, height = 0;
  bool severalPages = false;  // or frames; the hashes are those of the first
  bool hasHashes = false;
  PictureHashes hashes{};
  std::string digest = {};  // of all pages, 32 characters; empty if not computed
  float sharpness = -1;     // as MeasureSharpness; negative if not measured
};

// The store of picture hashes in the data folder, a RecordStore with 96 bytes of data per picture,
// little-endian:
//
//   offset size  content
//        0    8  width and height, 4 bytes each
//        8   64  eight hashes
//       72   16  digest of the pixels
//       88    4  bit 0: has hashes, bit 1: has a digest, bit 2: has a sharpness,
//                 bit 3: several pages, bit 4: always set; other records are ignored, as
//                 they know nothing of pages
//       92    4  sharpness, IEEE 754 single; else 0
inline constexpr std::string_view kHashStoreName = "Fotomill.hashes";

// A store. Not thread-safe.
class HashStore {
 public:
  explicit HashStore(std::string path);  // loads it

  // The record for a file with this size and time.
  std::optional<HashRecord> Find(const std::string& path, uint64_t size, int64_t modified) const;
  // As those of RecordStore.
  void Put(const std::string& path, const HashRecord& record);
  [[nodiscard]] bool Save() { return store_.Save(); }
  const std::string& SetAside() const { return store_.SetAside(); }

 private:
  RecordStore store_;
};

}  // namespace fotomill
