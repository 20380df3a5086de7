#include <algorithm>
#include <cstring>
#include <vector>

#include "catalog/thumbnails/thumbnail_database.h"
#include "platform/files.h"
#include "support/scratch_file.h"

// The input is a database without pixels: a header, and 64 bytes per record: magic, path, volume,
// flags. The remainder is a truncated record.

namespace fotomill {
namespace {

using fuzz::Require;

constexpr size_t kShortRecord = 64, kShortPath = 40, kShortVolume = 18;

std::vector<uint8_t> Expand(const uint8_t* data, size_t size) {
  std::vector<uint8_t> file(data, data + std::min(size, kDatabaseHeaderSize));
  for (size_t at = kDatabaseHeaderSize; at < size; at += kShortRecord) {
    const size_t start = file.size(), count = std::min(kShortRecord, size - at);
    uint8_t record[kShortRecord] = {};
    std::memcpy(record, data + at, count);
    if (count < kShortRecord) {
      file.insert(file.end(), record, record + count);
      break;
    }
    file.resize(start + kDatabaseRecordSize);
    std::memcpy(&file[start], record, 4);
    std::memcpy(&file[start + 27912], record + 4, kShortPath);
    std::memcpy(&file[start + 28173], record + 4 + kShortPath, kShortVolume);
    file[start + 28434] = record[kShortRecord - 1];
  }
  return file;
}

// Lookups must find the same as a scan over the records.
void CompareLookups(ThumbnailDatabase& database, int64_t count) {
  DatabaseRecord wanted, record;
  for (int64_t i = 0; i < count; ++i) {
    if (!database.ReadDatabaseRecord(i, wanted)) continue;
    ThumbnailRecord found;
    int64_t first = 0;
    const auto matches = [&] {
      return database.ReadDatabaseRecord(first, record) && !record.deleted &&
             record.path == wanted.path && record.volume == wanted.volume;
    };
    while (first < count && !matches()) ++first;
    Require(database.Find(wanted.path, wanted.volume, found) == (first < count));
    if (first < count) Require(found.bytes == record.thumbnail.bytes);
  }
}

void TryChanges(ThumbnailDatabase& database, const std::string& path, int64_t count) {
  DatabaseRecord record;
  record.thumbnail.Sign();
  record.path = "/a";
  record.volume = "v";
  const bool added = database.AppendDatabaseRecords({&record, 1}, true);
  ThumbnailRecord found;
  if (added) Require(database.Find("/a", "v", found));
  if (added) Require(database.Delete("/a") >= 1);
  Require(!added || !database.Find("/a", "v", found));
  DatabaseHeader header;
  if (database.CompactThumbnailDatabase(false) == ThumbnailDatabase::Compacted::Done) {
    Require(database.ReadDatabaseHeader(header) && header.count <= count + added);
    Require(platform::FactsOf(path).size ==
            kDatabaseHeaderSize + static_cast<uint64_t>(header.count) * kDatabaseRecordSize);
    CompareLookups(database, header.count);
  }
}

}  // namespace
}  // namespace fotomill

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
  using namespace fotomill;
  static const std::string path = fuzz::ScratchPath("a") + ".tdb";
  if (size > kDatabaseHeaderSize + 12 * kShortRecord) return 0;
  const std::vector<uint8_t> file = Expand(data, size);
  Require(
      platform::WriteWholeFile(path, {reinterpret_cast<const char*>(file.data()), file.size()}));
  ThumbnailDatabase database;
  DatabaseHeader header;
  if (database.OpenThumbnailDatabase(path, true) != ThumbnailDatabase::Opened::Done) return 0;
  Require(database.ReadDatabaseHeader(header));
  const int64_t count = database.RecordCount(header);
  CompareLookups(database, count);
  TryChanges(database, path, count);
  return 0;
}
