#include "desktop/models/thumbnails/thumbnail.h"

#include <algorithm>
#include <mutex>
#include <utility>
#include <vector>

#include "catalog/thumbnails/exif_thumbnail.h"
#include "catalog/thumbnails/system_thumbnail.h"
#include "catalog/thumbnails/thumbnail_database.h"
#include "catalog/thumbnails/thumbnail_file.h"
#include "core/choice_lists.h"
#include "metadata/exif/exif_source.h"
#include "metadata/exif/exif_walk.h"
#include "platform/files.h"
#include "platform/paths.h"
#include "processing/geometry/scale.h"
#include "processing/faces/face_finder.h"
#include "registry/registry.h"

namespace fotomill::desktop {

namespace {

bool ReadCurrentFile(const ThumbnailRequest& request, ThumbnailRecord& record) {
  const std::string path = ThumbnailPathFor(request.path);
  const platform::FileFacts facts = platform::FactsOf(path);
  return facts.kind == platform::FileKind::Regular && facts.modified >= request.modified &&
         ReadThumbnailFile(record, path);
}

bool InDatabase(const ThumbnailRequest& request) {
  return request.mode == choice::kGlobalDatabase || request.mode == choice::kLocalDatabase;
}

std::string DatabaseFor(const ThumbnailRequest& request) {
  return ThumbnailDatabasePath(
      request.mode == choice::kGlobalDatabase ? std::string() : platform::FolderOf(request.path));
}

// The database that was asked last stays open: its index is what makes a search quick. New records
// are gathered, since every append waits for the disk.
class OpenDatabase {
 public:
  bool Find(const ThumbnailRequest& request, ThumbnailRecord& record) {
    const std::lock_guard lock(mutex_);
    hidden_ = request.options.hidden;
    return Open(DatabaseFor(request), false) &&
           database_.Find(request.path, VolumeKeyFor(request.path), record);
  }
  void Add(const ThumbnailRequest& request, const ThumbnailRecord& record) {
    const std::lock_guard lock(mutex_);
    const std::string path = DatabaseFor(request);
    if (path != newPath_ || new_.size() >= kGathered) Write();
    newPath_ = path;
    hidden_ = request.options.hidden;
    new_.push_back({record, request.path, VolumeKeyFor(request.path), false});
  }
  void Flush() {
    const std::lock_guard lock(mutex_);
    Write();
  }
  void Drop(const std::string& path, const std::string& database) {
    const std::lock_guard lock(mutex_);
    Write();
    if (platform::IsRegularFile(database) && Open(database, false)) (void)database_.Delete(path);
  }

 private:
  static constexpr size_t kGathered = 64;

  bool Open(const std::string& path, bool create) {
    if (path == openPath_) return true;
    openPath_.clear();
    database_.CloseThumbnailDatabase();
    if (database_.OpenThumbnailDatabase(path, create, hidden_) != ThumbnailDatabase::Opened::Done)
      return false;
    openPath_ = path;
    return true;
  }
  // A database that cannot be written to costs the thumbnails no more than being made again.
  void Write() {
    const std::vector<DatabaseRecord> records = std::exchange(new_, {});
    if (!records.empty() && Open(newPath_, true))
      (void)database_.AppendDatabaseRecords(records, true);
  }

  std::mutex mutex_;
  std::string openPath_, newPath_;
  bool hidden_ = true;
  ThumbnailDatabase database_;
  std::vector<DatabaseRecord> new_;
};
OpenDatabase openDatabase;

bool FindRecord(const ThumbnailRequest& request, ThumbnailRecord& record) {
  if (request.side > kSmallThumbnailSide) return false;  // a record would have to be enlarged
  if (request.mode == choice::kDiskBased || request.options.fromFiles) {
    if (ReadCurrentFile(request, record)) return true;
  }
  return InDatabase(request) && openDatabase.Find(request, record);
}

Status ScaleDown(const PackedImage& image, int32_t side, RgbImage& pixels) {
  if (image.Width() <= side && image.Height() <= side) return ToRgb(image, pixels);
  PackedImage scaled, noAlpha, noScaledAlpha;
  RETURN_IF_BAD(ScaleFiltered(image, noAlpha, FitSize(image.Width(), image.Height(), side),
                              ScaleFilter::Bicubic, scaled, noScaledAlpha));
  return ToRgb(scaled, pixels);
}

Status PixelsOfRecord(const ThumbnailRecord& record, const ThumbnailRequest& request,
                      RgbImage& pixels) {
  PackedImage bitmap;
  RETURN_IF_BAD(ThumbnailRecordToBitmap(record, bitmap));
  RETURN_IF_BAD(ToRgb(bitmap, pixels));
  pixels = WithoutMatte(pixels, request.options.matte);
  if (std::max(pixels.width, pixels.height) <= request.side) return Status::Ok;
  RETURN_IF_BAD(ToPacked(pixels, bitmap));
  return ScaleDown(bitmap, request.side, pixels);
}

Status PixelsOfPicture(PictureRecord& picture, const ThumbnailRequest& request, RgbImage& pixels) {
  RETURN_IF_BAD(PrepareForDisplay(picture, request.options.matte));
  return ScaleDown(picture.image, request.side, pixels);
}

// A thumbnail that was made earlier.
bool ReadReady(const ThumbnailRequest& request, Thumbnail& thumbnail) {
  ThumbnailRecord record;
  if (FindRecord(request, record) &&
      PixelsOfRecord(record, request, thumbnail.pixels) == Status::Ok)
    return true;
  const bool fromSystem = request.mode == choice::kDiskBased && request.options.fromSystem &&
                          request.side > kSmallThumbnailSide;
  const PicturePointer picture =
      fromSystem ? ReadSystemPicture(request.path, request.side) : nullptr;
  return picture != nullptr && PixelsOfPicture(*picture, request, thumbnail.pixels) == Status::Ok;
}

// The thumbnail in the file's EXIF, upright as the picture would be.
bool ReadEmbedded(const ThumbnailRequest& request, Thumbnail& thumbnail) {
  ExifSource source;
  ExifFindings findings;
  if (source.Open(request.path.c_str()) != Status::Ok ||
      !WalkExif(source.Block(), nullptr, &findings))
    return false;
  PicturePointer picture;
  if (DecodeExifThumbnail(ExifThumbnail(source.Block(), findings), picture) != Status::Ok)
    return false;
  picture->metadata.exif.assign(source.Block().begin(), source.Block().end());
  thumbnail.standIn = true;
  return PixelsOfPicture(*picture, request, thumbnail.pixels) == Status::Ok && source.Intact();
}

void CopyFacts(const PictureRecord& picture, Thumbnail& thumbnail) {
  thumbnail.width = picture.width;
  thumbnail.height = picture.height;
  thumbnail.bits = picture.bitsPerPixel;
  thumbnail.pages = picture.pageCount;
  thumbnail.alpha = (picture.alphaFlags & kHasAlpha) != 0;
  thumbnail.animated =
      picture.pageCount > 1 && (FormatRow(picture.formatIndex).flags & FMT_ANIMATED) != 0;
}

// What a record does not know of files that may have several pages: it is quickly told by their
// heads.
void ReadPages(const std::string& path, const ReadOptions& options, Thumbnail& thumbnail) {
  const int32_t format = FindFormatByName(path);
  PicturePointer picture;
  if (format == kNoFormat || format == kSpareRow || (FormatRow(format).flags & FMT_MULTI) == 0)
    return;
  if (LoadPictureInfo({.fileName = path, .options = options}, picture) == Status::Ok)
    CopyFacts(*picture, thumbnail);
}

Status MakeFromPicture(const ThumbnailRequest& request, Thumbnail& thumbnail) {
  PicturePointer picture;
  const bool onFaces =
      InDatabase(request) ? request.options.onFaces : request.options.onFacesUnkept;
  const ReadRequest read{
      .fileName = request.path,
      .thumbnailSide = onFaces ? std::max(request.side, kFramingSide) : request.side,
      .partial = true,
      .options = request.options.read};
  RETURN_IF_BAD(LoadPictureInfo(read, picture));
  CopyFacts(*picture, thumbnail);
  RETURN_IF_BAD(ReadPicture(read, *picture));
  thumbnail.partial = picture->shortfall != Status::Ok;
  thumbnail.alpha = !picture->alpha.Empty();
  if (onFaces)
    RETURN_IF_BAD(FrameOnFaces(*picture, request.options.faces, request.options.onAllFaces));
  RETURN_IF_BAD(PrepareForDisplay(*picture, request.options.matte));
  ThumbnailRecord record;
  if (!thumbnail.partial && InDatabase(request) && request.options.keep &&
      MakeThumbnailRecord(record, *picture, request.options))
    openDatabase.Add(request, record);
  return ScaleDown(picture->image, request.side, thumbnail.pixels);
}

}  // namespace

ThumbnailPointer LoadThumbnail(const ThumbnailRequest& request) {
  auto thumbnail = std::make_shared<Thumbnail>();
  if (ReadReady(request, *thumbnail)) {
    ReadPages(request.path, request.options.read, *thumbnail);
    return thumbnail;
  }
  if (request.standIn) return ReadEmbedded(request, *thumbnail) ? thumbnail : nullptr;
  thumbnail->status = MakeFromPicture(request, *thumbnail);
  if (thumbnail->status != Status::Ok) thumbnail->pixels = {};
  return thumbnail;
}

bool MayHoldThumbnail(int32_t format) {
  return format != kNoFormat && FormatRow(format).keepsMetadata != 0;
}

void KeepThumbnailRecords() { openDatabase.Flush(); }

void DropThumbnails(const std::string& path) {
  const std::string file = ThumbnailPathFor(path);
  ThumbnailRecord record;
  if (!platform::FactsOf(file).link && ReadThumbnailFile(record, file))
    (void)platform::DeleteFile(file);
  openDatabase.Drop(path, ThumbnailDatabasePath({}));
  openDatabase.Drop(path, ThumbnailDatabasePath(platform::FolderOf(path)));
}

Status WriteThumbnail(const std::string& path, const ThumbnailOptions& options) {
  ThumbnailRecord record;
  RETURN_IF_BAD(MakeThumbnailOfFile(path, options, record));
  return WriteThumbnailFile(record, ThumbnailPathFor(path), options.hidden)
             ? Status::Ok
             : Status::ErrorCreatingFile;
}

}  // namespace fotomill::desktop
