#include "catalog/thumbnails/database_upkeep.h"

#include <optional>

#include "catalog/thumbnails/orphan_times.h"
#include "catalog/thumbnails/thumbnail_database.h"
#include "platform/clock.h"
#include "platform/files.h"

namespace fotomill {

namespace {

constexpr int64_t kSecondsPerDay = 86'400;

// Whether compaction would remove a quarter of the records; empty if stopped or unreadable.
std::optional<bool> IsWorthPurging(const ThumbnailDatabase& database, const StopToken& stop) {
  DatabaseHeader header;
  if (!database.ReadDatabaseHeader(header)) return std::nullopt;
  const int64_t count = database.RecordCount(header);
  int64_t useless = 0;
  DatabaseKey key;
  for (int64_t i = 0; i < count; ++i) {
    if (stop.Asked() || !database.ReadKey(i, key)) return std::nullopt;
    const bool missing = !key.deleted &&
                         platform::FactsOf(key.path).kind == platform::FileKind::Missing &&
                         PurgesMissing(key);
    if (key.deleted || missing) ++useless;
  }
  return useless > 0 && useless * 4 >= count;
}

}  // namespace

bool PurgeDatabaseWhenDue(const std::string& path, int32_t days, bool hidden,
                          const StopToken& stop) {
  const int64_t now = platform::Now();
  if (path.empty() || now < LastOrphanRemoval(path) + days * kSecondsPerDay) return false;
  ThumbnailDatabase database;
  if (database.OpenThumbnailDatabase(path, false, hidden) != ThumbnailDatabase::Opened::Done)
    return false;
  const std::optional<bool> worth = IsWorthPurging(database, stop);
  if (!worth || (*worth && database.CompactThumbnailDatabase(true, nullptr, stop) !=
                               ThumbnailDatabase::Compacted::Done))
    return false;
  return KeepOrphanRemoval(path, now);
}

}  // namespace fotomill
