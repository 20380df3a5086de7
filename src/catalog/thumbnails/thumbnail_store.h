#pragma once

#include <cstddef>
#include <mutex>
#include <span>
#include <string>
#include <vector>

#include "catalog/thumbnails/thumbnail_database.h"

namespace fotomill {

// Thread-safe access to the thumbnail databases of the program. The last
// one used stays open, since its index makes lookups fast; new records are
// collected, since every append waits for the disk. No errors are reported:
// if a database cannot be read or written, thumbnails are just made again.
class ThumbnailStore {
 public:
  // As ThumbnailDatabase::Find, for a path on its current volume; false without a database.
  bool Find(const std::string& database, const std::string& path, const PictureStamp& stamp,
            ThumbnailRecord& thumbnail);
  // Adds a record to a database, which is created if missing, and hidden with `hidden`. Earlier
  // records of the same path and volume are marked as deleted. Ignored if the path is too long.
  void Add(const std::string& database, DatabaseRecord record, bool hidden);
  // Appends the collected records.
  void Flush();
  // Marks the records of these paths, and of all files below these folders, as deleted in an
  // existing database. True on success, or if there was nothing to mark.
  bool Delete(const std::string& database, std::span<const std::string> paths,
              std::span<const std::string> folders);
  // Closes the open database after appending collected records.
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

// The store of this program.
ThumbnailStore& SharedThumbnailStore();

}  // namespace fotomill
