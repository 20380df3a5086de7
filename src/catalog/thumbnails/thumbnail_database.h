#pragma once

#include <atomic>
#include <cstdint>
#include <span>
#include <string>
#include <string_view>
#include <vector>

#include "catalog/thumbnails/thumbnail_index.h"
#include "catalog/thumbnails/thumbnail_record.h"
#include "core/progress.h"
#include "core/workers/stop_token.h"
#include "platform/store_file.h"

namespace fotomill {

// The thumbnail database: a header and fixed-size records, append-only. Little-endian:
//
//   header  offset size  field
//                0    8  magic "BRNTTDBX"
//                8    4  version word 0x01600100
//               12    4  count of records, signed
//               16    4  0
//               20    4  creation time, seconds since 1970 UTC
//               24    4  time of the last append
//               28   32  0
//   record  offset size  field; record i begins at 60 + i x 28442
//                0 27912 a small thumbnail record
//            27912  261  path of the picture, NUL-terminated
//            28173  261  key of its volume, NUL-terminated
//            28434    1  flags: bit 0: deleted
//            28435    4  modification time of the picture, seconds since 1970 UTC, modulo 2^32
//            28439    3  size of the picture, bytes, modulo 2^24
//
// Time and size show whether the picture is still the one that the record was made of. If all seven
// bytes are 0, they are unknown, and the record applies to any picture with its path; some programs
// do not write these bytes.
//
// The global database is in the data folder, a local one in the folder of its pictures. A record is
// synced to disk before the header counts it; bytes after the counted records are meaningless.
inline constexpr size_t kDatabaseHeaderSize = 60;
inline constexpr size_t kDatabaseRecordSize = 28442;  // bytes
inline constexpr std::string_view kDatabaseMagic = "BRNTTDBX";  // at the start of the file
inline constexpr uint32_t kDatabaseVersion = 0x01600100;  // of new databases
inline constexpr std::string_view kDatabaseName = "Fotomill.tdb";  // file name

// The header, without its magic.
struct DatabaseHeader {
  uint32_t version = kDatabaseVersion;
  int32_t count = 0;
  uint32_t created = 0, appended = 0;  // seconds since 1970 UTC
};

// Time and size of a picture, as stored in records.
struct PictureStamp {
  uint32_t modified = 0;  // seconds since 1970 UTC, modulo 2^32
  uint32_t size = 0;      // bytes, modulo 2^24
  bool operator==(const PictureStamp&) const = default;
  bool Known() const { return modified != 0 || size != 0; }
  // Whether both may have the same contents: they are equal, or one is unknown.
  bool Suits(const PictureStamp& other) const {
    return !Known() || !other.Known() || *this == other;
  }
};
// `modified` in seconds since 1970 UTC, `size` in bytes.
PictureStamp PictureStampOf(int64_t modified, uint64_t size);
// The current state of a file; unknown if it is not a regular file.
PictureStamp PictureStampOf(const std::string& path);

inline constexpr size_t kLongestDatabasePath = 260;  // bytes

// A record in memory.
struct DatabaseRecord {
  ThumbnailRecord thumbnail;
  std::string path;    // at most kLongestDatabasePath
  std::string volume;  // likewise
  bool deleted = false;
  PictureStamp stamp = {};  // state of the picture when the thumbnail was made
};

// A record without its thumbnail.
struct DatabaseKey {
  std::string path, volume;
  bool deleted = false;
  PictureStamp stamp = {};
};

// Key of the volume with a path: label and serial number as "LABEL:12345", only the label if that
// is too long; "Unknown" if not available.
std::string VolumeKeyFor(const std::string& path);

// Whether compaction should check if a picture exists: not on network, optical and removable
// drives, and not if a different volume than the record's is mounted now.
bool PurgesMissing(const DatabaseKey& key);

// The database of a folder; for an empty folder the global database, whose path is empty if there
// is no data folder.
std::string ThumbnailDatabasePath(const std::string& folder);

// Shared by all browsers. kCompareExtensions: pictures that differ only in their extension are
// different.
inline constexpr uint8_t kCompareExtensions = 1;
inline std::atomic<uint8_t> browserOptions{kCompareExtensions};

// An open database. Every change locks the file, so several processes may append concurrently. The
// time of lookups and appends does not depend on the number of records, thanks to an index, which
// is stored between runs in "PATH.index". Not thread-safe.
class ThumbnailDatabase {
 public:
  ThumbnailDatabase() = default;
  ThumbnailDatabase(const ThumbnailDatabase&) = delete;
  ThumbnailDatabase& operator=(const ThumbnailDatabase&) = delete;
  ~ThumbnailDatabase() { CloseThumbnailDatabase(); }

  // The result of opening a database.
  enum class Opened {
    Done,
    Missing,
    NotRead,  // it cannot be opened or is not a database; left unchanged
    Failed,   // it could not be created
  };
  // Opens a database; with `create`, creates an empty one if it is missing. With `hidden`, new
  // files are hidden, also later.
  Opened OpenThumbnailDatabase(const std::string& path, bool create, bool hidden = true);
  // Opens a database for lookups. It may be
  // read-only, but then cannot be changed.
  Opened OpenToRead(const std::string& path, bool hidden = true);
  // Whether a database is open and can be changed.
  bool IsOpenForChanges() const { return file_.IsOpen() && !readOnly_; }
  void CloseThumbnailDatabase();  // no-op if none is open

  // False if the file is shorter than a header or not a database.
  bool ReadDatabaseHeader(DatabaseHeader& header) const;
  // The number of counted records that are in the file.
  int64_t RecordCount(const DatabaseHeader& header) const;
  // False beyond the end of the file, or if there is no small thumbnail.
  bool ReadDatabaseRecord(int64_t index, DatabaseRecord& record) const;
  // Reads a record without the thumbnail's pixels.
  bool ReadKey(int64_t index, DatabaseKey& key) const;

  // Appends records and syncs. With `replace`, then marks earlier records of the same path and
  // volume as deleted. False if not all could be written, or if the header counts more records than
  // there are; the number of records is unchanged then.
  bool AppendDatabaseRecords(std::span<const DatabaseRecord> records, bool replace);
  bool AppendDatabaseRecord(const DatabaseRecord& record) {
    return AppendDatabaseRecords({&record, 1}, false);
  }
  // Overwrites a counted record and syncs.
  bool WriteDatabaseRecord(int64_t index, const DatabaseRecord& record);
  // Finds the first undeleted record of a path and volume with a matching stamp. False if there is
  // none; `thumbnail` is undefined then.
  bool Find(const std::string& path, const std::string& volume, ThumbnailRecord& thumbnail,
            const PictureStamp& stamp = {});
  // Marks all records of these paths as deleted, on any volume; returns their number, -1 on
  // failure. Each mark is a single byte: if interrupted, every record is either unchanged or
  // deleted.
  int64_t Delete(std::span<const std::string> paths);
  int64_t Delete(const std::string& path) { return Delete({&path, 1}); }
  // The same for all paths below these folders; reads the keys of all records.
  int64_t DeleteBelow(std::span<const std::string> folders);

  // The result of a compaction.
  enum class Compacted {
    Done,
    NotRead,  // a record cannot be read, or the header counts more records than there are
    Failed,   // the new file could not be written
    Stopped,  // canceled
  };
  // Copies all undeleted records (with `purgeMissing`, only those whose picture exists) to
  // "PATH.BAK", which then atomically replaces the database. On failure, the database is unchanged.
  Compacted CompactThumbnailDatabase(bool purgeMissing, ProgressSink* progress = nullptr,
                                     const StopToken& stop = {});

 private:
  enum class KeyRead { Done, NoThumbnail, Failed };
  KeyRead TryKey(int64_t index, DatabaseKey& key) const;
  Opened OpenFile(const std::string& path, bool create, bool readOnlyToo);
  bool LockAndCheck(DatabaseHeader& header);
  ThumbnailIndex::State StateOf(const DatabaseHeader& header) const;
  bool UpdateIndex(const ThumbnailIndex::State& state);
  struct Wanted;
  bool TakeThumbnail(int64_t index, const Wanted& wanted, ThumbnailRecord& thumbnail) const;
  int64_t MarkAllDeleted(const std::vector<size_t>& records, const DatabaseHeader& header);
  bool BuildIndex(int64_t count);
  bool FindRecordsToReplace(std::span<const DatabaseRecord> records, int64_t first,
                            std::vector<int64_t>& replaced) const;
  bool WriteRecords(std::span<const DatabaseRecord> records, int64_t first);
  bool WriteDatabaseHeader(const DatabaseHeader& header);
  bool MarkDeleted(int64_t index);
  Compacted CompactLocked(bool purge, ProgressSink* progress, const StopToken& stop);
  Compacted CopyLiveRecords(platform::StoreFile& to, DatabaseHeader header, bool purge,
                            ProgressSink* progress, const StopToken& stop);

  std::string path_;
  bool hidden_ = false;
  bool readOnlyToo_ = false;  // as requested when opening
  bool readOnly_ = false;     // as actually opened
  platform::StoreFile file_;
  ThumbnailIndex index_;
  // state of the file known to the index; if it differs, another process has changed the file
  ThumbnailIndex::State indexed_;
  ThumbnailIndex::State saved_;    // state known to the saved index
  bool triedFile_ = false;         // a lookup has tried the saved index
};

// Finds the first record with exactly this path, deleted or not, on any volume. Also false if an
// earlier record cannot be read.
bool FindDatabaseThumbnail(ThumbnailRecord& thumbnail, const std::string& path,
                           const std::string& databasePath);

}  // namespace fotomill
