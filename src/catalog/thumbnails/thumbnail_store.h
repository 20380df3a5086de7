#pragma once

#include <cstddef>
#include <mutex>
#include <span>
#include <string>
#include <vector>

#include "catalog/thumbnails/thumbnail_database.h"

namespace fotomill {

// The thumbnail databases as the program works with them, from any thread. The one that was asked
// last stays open, since its index is what makes a search quick; new records are gathered, since
// every append waits for the disk. A database that cannot be read or written costs thumbnails no
// more than being made again, so nothing here fails.
class ThumbnailStore {
 public:
  // As ThumbnailDatabase::Find, for a path on its own volume; false without such a database.
  bool Find(const std::string& database, const std::string& path, const PictureStamp& stamp,
            ThumbnailRecord& thumbnail);
  // Takes over a record for a database, which is made if it is missing, and hidden with `hidden`.
  // Earlier records of the same path and volume are then marked deleted.
  void Add(const std::string& database, DatabaseRecord record, bool hidden);
  // Appends the records that were gathered.
  void Flush();
  // Marks the records of these paths deleted, and all those below these folders, in a database that
  // exists. True if there was nothing to mark or it was done.
  bool Delete(const std::string& database, std::span<const std::string> paths,
              std::span<const std::string> folders);
  // Closes what is open; what was gathered is appended.
  void Close();

 private:
  static constexpr size_t kGathered = 64;  // records, about 2 MB

  bool OpenToRead(const std::string& database);
  bool OpenToWrite(const std::string& database, bool create);
  void Append();

  std::mutex mutex_;
  std::string openPath_, newPath_;
  bool hidden_ = true;
  ThumbnailDatabase database_;
  std::vector<DatabaseRecord> new_;  // for newPath_
};

// The one of this program.
ThumbnailStore& SharedThumbnailStore();

}  // namespace fotomill
