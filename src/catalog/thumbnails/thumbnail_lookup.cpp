#include "catalog/thumbnails/thumbnail_lookup.h"

#include "catalog/thumbnails/system_thumbnail.h"
#include "catalog/thumbnails/thumbnail_database.h"
#include "catalog/thumbnails/thumbnail_file.h"
#include "platform/paths.h"
#include "settings/settings.h"

namespace fotomill {

namespace {

bool ReadFromSystem(const std::string& picturePath, AnyThumbnailRecord& record) {
  LargeThumbnailRecord large;
  if (!ReadSystemThumbnail(picturePath, large)) return false;
  record = large;
  return true;
}

bool ReadListed(const std::string& picturePath, const ThumbnailSources& sources, ThumbnailRecord& record) {
  const ThumbnailRecord* const listed = sources.listed ? sources.listed(platform::FileNameOf(picturePath)) : nullptr;
  if (listed != nullptr) record = *listed;
  return listed != nullptr;
}

bool ReadSmall(const std::string& picturePath, const ThumbnailSources& sources, ThumbnailRecord& record) {
  const bool usesFile = sources.mode == choice::kDiskBased || settings.AlwaysUseTHN != 0;
  if (usesFile && ReadThumbnailFile(record, ThumbnailPathFor(picturePath))) return true;
  switch (sources.mode) {
    case choice::kDiskBased: return false;
    case choice::kVirtual: return ReadListed(picturePath, sources, record);
    case choice::kGlobalDatabase:
    case choice::kLocalDatabase: break;
  }
  return sources.database != nullptr && sources.database->Find(picturePath, VolumeKeyFor(picturePath), record);
}

}  // namespace

bool LookUpThumbnail(const std::string& picturePath, bool large, const ThumbnailSources& sources, AnyThumbnailRecord& record) {
  const bool fromSystem =
      large && sources.mode == choice::kDiskBased && sources.systemCache && settings.UseWindowsThumbnailCache != 0;
  if (fromSystem && ReadFromSystem(picturePath, record)) return true;
  ThumbnailRecord small;
  if (!ReadSmall(picturePath, sources, small)) return false;
  record = small;
  return true;
}

}  // namespace fotomill
