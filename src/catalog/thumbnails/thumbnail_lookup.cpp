#include "catalog/thumbnails/thumbnail_lookup.h"

#include "catalog/thumbnails/system_thumbnail.h"
#include "catalog/thumbnails/thumbnail_database.h"
#include "catalog/thumbnails/thumbnail_file.h"
#include "platform/paths.h"

namespace fotomill {

namespace {

bool ReadFromSystem(const std::string& picturePath, Color matte, AnyThumbnailRecord& record) {
  LargeThumbnailRecord large;
  if (!ReadSystemThumbnail(picturePath, matte, large)) return false;
  record = large;
  return true;
}

bool ReadListed(const std::string& picturePath, const ThumbnailSources& sources,
                ThumbnailRecord& record) {
  const ThumbnailRecord* const listed =
      sources.listed ? sources.listed(platform::FileNameOf(picturePath)) : nullptr;
  if (listed != nullptr) record = *listed;
  return listed != nullptr;
}

bool ReadSmall(const std::string& picturePath, const ThumbnailSources& sources,
               ThumbnailRecord& record) {
  const bool usesFile = sources.mode == choice::kDiskBased || sources.options.fromFiles;
  if (usesFile && ReadThumbnailFile(record, ThumbnailPathFor(picturePath))) return true;
  switch (sources.mode) {
    case choice::kDiskBased: return false;
    case choice::kVirtual: return ReadListed(picturePath, sources, record);
    case choice::kGlobalDatabase:
    case choice::kLocalDatabase: break;
  }
  return sources.database != nullptr &&
         sources.database->Find(picturePath, VolumeKeyFor(picturePath), record);
}

}  // namespace

bool LookUpThumbnail(const std::string& picturePath, bool large, const ThumbnailSources& sources,
                     AnyThumbnailRecord& record) {
  const bool fromSystem = large && sources.mode == choice::kDiskBased && sources.systemCache &&
                          sources.options.fromSystem;
  if (fromSystem && ReadFromSystem(picturePath, sources.options.matte, record)) return true;
  ThumbnailRecord small;
  if (!ReadSmall(picturePath, sources, small)) return false;
  record = small;
  return true;
}

}  // namespace fotomill
