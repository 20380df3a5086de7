#include "desktop/thumbnail.h"

#include <algorithm>
#include <mutex>

#include "catalog/thumbnail_database.h"
#include "catalog/thumbnail_file.h"
#include "core/choice_lists.h"
#include "core/settings.h"
#include "picture/registry.h"
#include "platform/files.h"
#include "platform/paths.h"
#include "processing/scale.h"

namespace fotomill::desktop {

namespace {

bool ReadCurrentFile(const ThumbnailWish& wish, ThumbnailRecord& record) {
  const std::string path = ThumbnailPathFor(wish.path);
  const platform::FileFacts facts = platform::FactsOf(path);
  return facts.kind == platform::FileKind::Regular && facts.modified >= wish.modified && ReadThumbnailFile(record, path);
}

// The database that was asked last stays open: its index is what makes a search quick.
bool FindInDatabase(const ThumbnailWish& wish, ThumbnailRecord& record) {
  static std::mutex mutex;
  static std::string openPath;
  static ThumbnailDatabase database;
  const std::string folder(platform::SplitPath(wish.path).folder);
  const std::string path = ThumbnailDatabasePath(wish.mode == choice::kGlobalDatabase ? std::string() : folder);
  const std::lock_guard lock(mutex);
  if (path != openPath) {
    openPath.clear();
    database.CloseThumbnailDatabase();
    if (database.OpenThumbnailDatabase(path, false) != ThumbnailDatabase::Opened::Done) return false;
    openPath = path;
  }
  return database.Find(wish.path, VolumeKeyFor(wish.path), record);
}

bool FindRecord(const ThumbnailWish& wish, ThumbnailRecord& record) {
  if (wish.side > kSmallThumbnailSide) return false;  // a record would have to be enlarged
  if (wish.mode == choice::kDiskBased || settings.AlwaysUseTHN != 0) {
    if (ReadCurrentFile(wish, record)) return true;
  }
  if (wish.mode != choice::kGlobalDatabase && wish.mode != choice::kLocalDatabase) return false;
  return FindInDatabase(wish, record);
}

Status PixelsOfRecord(const ThumbnailRecord& record, RgbImage& pixels) {
  PackedImage bitmap;
  RETURN_IF_BAD(ThumbnailRecordToBitmap(record, bitmap));
  RETURN_IF_BAD(ToRgb(bitmap, pixels));
  pixels = WithoutMatte(pixels, static_cast<Color>(settings.ThumbnailMatte));
  return Status::Ok;
}

Status ScaleDown(const PackedImage& image, int32_t side, RgbImage& pixels) {
  if (image.Width() <= side && image.Height() <= side) return ToRgb(image, pixels);
  PackedImage scaled, noAlpha, noScaledAlpha;
  RETURN_IF_BAD(ScaleFiltered(image, noAlpha, FitSize(image.Width(), image.Height(), side), ScaleFilter::Bicubic, scaled,
                              noScaledAlpha));
  return ToRgb(scaled, pixels);
}

Status MakeFromPicture(const ThumbnailWish& wish, Thumbnail& thumbnail) {
  PicturePointer picture;
  RETURN_IF_BAD(LoadPictureInfo(wish.path.c_str(), picture));
  thumbnail.width = picture->width;
  thumbnail.height = picture->height;
  thumbnail.bits = picture->bitsPerPixel;
  thumbnail.pages = picture->pageCount;
  picture->thumbnailSide = wish.side;
  RETURN_IF_BAD(ReadPicture(*picture));
  thumbnail.alpha = !picture->alpha.Empty();
  RETURN_IF_BAD(PrepareForDisplay(*picture, static_cast<Color>(settings.ThumbnailMatte)));
  return ScaleDown(picture->image, wish.side, thumbnail.pixels);
}

}  // namespace

ThumbnailPointer LoadThumbnail(const ThumbnailWish& wish) {
  auto thumbnail = std::make_shared<Thumbnail>();
  ThumbnailRecord record;
  if (FindRecord(wish, record)) {
    thumbnail->status = PixelsOfRecord(record, thumbnail->pixels);
    if (thumbnail->status == Status::Ok) return thumbnail;
  }
  thumbnail->status = MakeFromPicture(wish, *thumbnail);
  if (thumbnail->status != Status::Ok) thumbnail->pixels = {};
  return thumbnail;
}

Status WriteThumbnail(const std::string& path) {
  ThumbnailRecord record;
  RETURN_IF_BAD(MakeThumbnailOfFile(path, record));
  return WriteThumbnailFile(record, ThumbnailPathFor(path)) ? Status::Ok : Status::ErrorCreatingFile;
}

}  // namespace fotomill::desktop
