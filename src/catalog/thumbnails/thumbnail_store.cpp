#include "catalog/thumbnails/thumbnail_store.h"

#include <utility>

#include "platform/files.h"

namespace fotomill {

bool ThumbnailStore::Find(const std::string& database, const std::string& path,
                          const PictureStamp& stamp, ThumbnailRecord& thumbnail) {
  const std::lock_guard lock(mutex_);
  return OpenToRead(database) && database_.Find(path, VolumeKeyFor(path), thumbnail, stamp);
}

void ThumbnailStore::Add(const std::string& database, DatabaseRecord record, bool hidden) {
  if (record.path.size() > kLongestDatabasePath) return;  // it would fail the whole append
  const std::lock_guard lock(mutex_);
  if (database != newPath_ || new_.size() >= kGathered) Append();
  newPath_ = database;
  hidden_ = hidden;
  new_.push_back(std::move(record));
}

void ThumbnailStore::Flush() {
  const std::lock_guard lock(mutex_);
  Append();
}

bool ThumbnailStore::Delete(const std::string& database, std::span<const std::string> paths,
                            std::span<const std::string> folders) {
  const std::lock_guard lock(mutex_);
  Append();
  if (platform::FactsOf(database).kind == platform::FileKind::Missing) return true;
  if (!OpenToWrite(database, false)) return false;
  const bool ofPaths = paths.empty() || database_.Delete(paths) >= 0;
  return (folders.empty() || database_.DeleteBelow(folders) >= 0) && ofPaths;
}

void ThumbnailStore::Close() {
  const std::lock_guard lock(mutex_);
  Append();
  openPath_.clear();
  database_.CloseThumbnailDatabase();
}

bool ThumbnailStore::OpenToRead(const std::string& database) {
  if (database.empty() || database == openPath_) return !database.empty();
  openPath_.clear();
  if (database_.OpenToRead(database, hidden_) != ThumbnailDatabase::Opened::Done) return false;
  openPath_ = database;
  return true;
}

bool ThumbnailStore::OpenToWrite(const std::string& database, bool create) {
  if (database.empty()) return false;
  if (database == openPath_ && database_.IsOpenForChanges() &&
      platform::FactsOf(database).kind == platform::FileKind::Regular)
    return true;
  openPath_.clear();
  if (database_.OpenThumbnailDatabase(database, create, hidden_) != ThumbnailDatabase::Opened::Done)
    return false;
  openPath_ = database;
  return true;
}

void ThumbnailStore::Append() {
  const std::vector<DatabaseRecord> records = std::exchange(new_, {});
  if (!records.empty() && OpenToWrite(newPath_, true))
    (void)database_.AppendDatabaseRecords(records, true);
}

ThumbnailStore& SharedThumbnailStore() {
  static ThumbnailStore store;
  return store;
}

}  // namespace fotomill
