#include "catalog/thumbnails/thumbnail_lookup.h"

#include "catalog/thumbnails/listed_thumbnails.h"
#include "catalog/thumbnails/system_thumbnail.h"
#include "catalog/thumbnails/thumbnail_database.h"
#include "catalog/thumbnails/thumbnail_file.h"
#include "catalog/thumbnails/thumbnail_store.h"
#include "platform/files.h"
#include "platform/paths.h"

namespace fotomill {

namespace {

bool ReadFromSystem(const std::string& picturePath, Color matte, AnyThumbnailRecord& record) {
  LargeThumbnailRecord large;
  if (!ReadSystemThumbnail(picturePath, matte, large)) return false;
  record = large;
  return true;
}

bool ReadCurrentFile(const ThumbnailQuery& picture, ThumbnailRecord& record) {
  const std::string path = ThumbnailPathFor(picture.path);
  const platform::FileFacts facts = platform::FactsOf(path);
  return facts.kind == platform::FileKind::Regular && facts.modified >= picture.modified &&
         ReadThumbnailFile(record, path);
}

bool ReadSmall(const ThumbnailQuery& picture, const ThumbnailSources& sources,
               ThumbnailRecord& record) {
  const bool usesFile = sources.mode == choice::kDiskBased || sources.options.fromFiles;
  if (usesFile && ReadCurrentFile(picture, record)) return true;
  const PictureStamp stamp = PictureStampOf(picture.modified, picture.size);
  switch (sources.mode) {
    case choice::kDiskBased: break;
    case choice::kVirtual:
      return sources.listed != nullptr && sources.listed->Find(picture.path, stamp, record);
    case choice::kGlobalDatabase:
    case choice::kLocalDatabase:
      return sources.databases != nullptr &&
             sources.databases->Find(DatabaseForMode(sources.mode, picture.path), picture.path,
                                     stamp, record);
  }
  return false;
}

}  // namespace

std::string DatabaseForMode(choice::ThumbnailMode mode, const std::string& picturePath) {
  if (mode == choice::kGlobalDatabase) return ThumbnailDatabasePath({});
  return mode == choice::kLocalDatabase ? ThumbnailDatabasePath(platform::FolderOf(picturePath))
                                        : std::string();
}

bool LookUpThumbnail(const ThumbnailQuery& picture, const ThumbnailSources& sources,
                     AnyThumbnailRecord& record) {
  const bool fromSystem = picture.large && sources.mode == choice::kDiskBased &&
                          sources.systemCache && sources.options.fromSystem;
  if (fromSystem && ReadFromSystem(picture.path, sources.options.matte, record)) return true;
  ThumbnailRecord small;
  if (!ReadSmall(picture, sources, small)) return false;
  record = small;
  return true;
}

}  // namespace fotomill
