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

// The thumbnail database: a header and records of one size, only ever appended. Little-endian:
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
//            27912  261  path of the picture, zero-terminated
//            28173  261  key of its volume, zero-terminated
//            28434    1  flags: bit 0 set, the record is deleted
//            28435    4  modification time of the picture, seconds since 1970 UTC, modulo 2^32
//            28439    3  size of the picture, bytes, modulo 2^24
//
// Time and size tell whether the picture is still the one that the record was made of. All seven
// bytes 0: not known, so that the record goes for whatever has its path, as records of programs do
// that leave these bytes alone.
//
// The global database is in the data folder, a local one in the folder of its pictures. A record is
// written and on disk before the header counts it; what is behind the counted ones means nothing.
inline constexpr size_t kDatabaseHeaderSize = 60;
inline constexpr size_t kDatabaseRecordSize = 28442;  // bytes
inline constexpr std::string_view kDatabaseMagic = "BRNTTDBX";  // at the start of the file
inline constexpr uint32_t kDatabaseVersion = 0x01600100;  // of databases made now
inline constexpr std::string_view kDatabaseName = "Fotomill.tdb";  // file name in its folder

// The header, without its magic.
struct DatabaseHeader {
  uint32_t version = kDatabaseVersion;
  int32_t count = 0;
  uint32_t created = 0, appended = 0;  // seconds since 1970 UTC
};

// Time and size of a picture, as far as a record keeps them.
struct PictureStamp {
  uint32_t modified = 0;  // seconds since 1970 UTC, modulo 2^32
  uint32_t size = 0;      // bytes, modulo 2^24
  bool operator==(const PictureStamp&) const = default;
  bool Known() const { return modified != 0 || size != 0; }
  // Whether both may belong to the same contents: they are equal, or one is not known.
  bool Suits(const PictureStamp& other) const {
    return !Known() || !other.Known() || *this == other;
  }
};
// `modified`: seconds since 1970 UTC; `size`: bytes.
PictureStamp PictureStampOf(int64_t modified, uint64_t size);
// Of the file of that path as it is now; not known if it is no regular file.
PictureStamp PictureStampOf(const std::string& path);

// A record as it is read or appended.
struct DatabaseRecord {
  ThumbnailRecord thumbnail;
  std::string path;    // at most 260 bytes
  std::string volume;  // likewise
  bool deleted = false;
  PictureStamp stamp = {};  // of the picture when the thumbnail was made
};

// What a record is found by, without its thumbnail.
struct DatabaseKey {
  std::string path, volume;
  bool deleted = false;
  PictureStamp stamp = {};
};

// Key of the volume that holds a path: its label and serial number as "LABEL:12345", the label
// alone when both are too long; "Unknown" when it is not available.
std::string VolumeKeyFor(const std::string& path);

// Whether compaction tests a picture for existence: not on network, optical and removable drives,
// nor where another volume than the record's is mounted now.
bool PurgesMissing(const DatabaseKey& key);

// The database of a folder; of an empty one the global database, whose path is empty where there is
// no data folder.
std::string ThumbnailDatabasePath(const std::string& folder);

// What all browsers share: with kCompareExtensions, pictures that differ in their extension only
// are two.
inline constexpr uint8_t kCompareExtensions = 1;
inline std::atomic<uint8_t> browserOptions{kCompareExtensions};

// One open database. Every change holds the file's lock, so that several processes may append at
// once. Lookups and appends do not take longer the more records there are: an index, kept between
// runs in "PATH.index", says where to look. An object is used by one thread at a time.
class ThumbnailDatabase {
 public:
  ThumbnailDatabase() = default;
  ThumbnailDatabase(const ThumbnailDatabase&) = delete;
  ThumbnailDatabase& operator=(const ThumbnailDatabase&) = delete;
  ~ThumbnailDatabase() { CloseThumbnailDatabase(); }

  // What became of opening a database.
  enum class Opened {
    Done,
    Missing,
    NotRead,  // it cannot be opened or is no database: left alone
    Failed,   // it could not be made
  };
  // Opens the database of that path; with `create`, one that is missing is made with an empty
  // header. With `hidden` what is made, now or later, is hidden.
  Opened OpenThumbnailDatabase(const std::string& path, bool create, bool hidden = true);
  // The same for lookups only: one that may not be written to will do as well, and takes no changes
  // then.
  Opened OpenToRead(const std::string& path, bool hidden = true);
  // Whether one is open, and takes changes.
  bool IsOpenForChanges() const { return file_.IsOpen() && !readOnly_; }
  void CloseThumbnailDatabase();  // does nothing when none is open

  // False when the file is shorter than a header or not a database.
  bool ReadDatabaseHeader(DatabaseHeader& header) const;
  // How many of the counted records the file holds.
  int64_t RecordCount(const DatabaseHeader& header) const;
  // False beyond the end of the file, or if there is no small thumbnail.
  bool ReadDatabaseRecord(int64_t index, DatabaseRecord& record) const;
  // The same without the thumbnail's pixels.
  bool ReadKey(int64_t index, DatabaseKey& key) const;

  // Appends records and has them on disk. Earlier ones of the same path and volume, if any are to
  // be `replaced`, are then marked deleted. False when they could not all be written, or the header
  // counts more than the file holds; the file then has no more records than before.
  bool AppendDatabaseRecords(std::span<const DatabaseRecord> records, bool replace);
  bool AppendDatabaseRecord(const DatabaseRecord& record) {
    return AppendDatabaseRecords({&record, 1}, false);
  }
  // Puts a record in the place of one that is counted, and has it on disk.
  bool WriteDatabaseRecord(int64_t index, const DatabaseRecord& record);
  // The thumbnail of the first record that is not deleted, of that path and volume, and whose stamp
  // suits the picture's. False if there is none; `thumbnail` may then hold anything.
  bool Find(const std::string& path, const std::string& volume, ThumbnailRecord& thumbnail,
            const PictureStamp& stamp = {});
  // Marks every record of these paths deleted, whatever its volume; how many there were, -1 when it
  // could not be done. Each mark is one byte: whenever the work ends early, every record is either
  // as before or deleted.
  int64_t Delete(std::span<const std::string> paths);
  int64_t Delete(const std::string& path) { return Delete({&path, 1}); }
  // The same of all paths below these folders; reads the keys of all records.
  int64_t DeleteBelow(std::span<const std::string> folders);

  // What became of a compaction.
  enum class Compacted {
    Done,
    NotRead,  // a record cannot be read, or the header counts more than there are
    Failed,   // the new file could not be written
    Stopped,  // asked to stop
  };
  // Copies what is not deleted (and with `purgeMissing`, whose picture is there) into "PATH.BAK",
  // which then takes the database's place in one step. Otherwise the database stays unchanged.
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
  bool readOnlyToo_ = false;  // as it was asked for when it was opened
  bool readOnly_ = false;     // as it is open
  platform::StoreFile file_;
  ThumbnailIndex index_;
  // the file as the index knows it: in another state, someone else has changed it
  ThumbnailIndex::State indexed_;
  ThumbnailIndex::State saved_;    // as the saved index knows it
  bool triedFile_ = false;         // the saved index was asked for a lookup
};

// The thumbnail of the first record of exactly that path in a database, deleted or not and on
// whatever volume. False as well when a record before it cannot be read.
bool FindDatabaseThumbnail(ThumbnailRecord& thumbnail, const std::string& path,
                           const std::string& databasePath);

}  // namespace fotomill
