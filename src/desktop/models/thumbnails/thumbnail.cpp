#include "desktop/models/thumbnails/thumbnail.h"

#include <algorithm>

#include "catalog/thumbnails/exif_thumbnail.h"
#include "catalog/thumbnails/listed_thumbnails.h"
#include "catalog/thumbnails/system_thumbnail.h"
#include "catalog/thumbnails/thumbnail_database.h"
#include "catalog/thumbnails/thumbnail_file.h"
#include "catalog/thumbnails/thumbnail_lookup.h"
#include "catalog/thumbnails/thumbnail_store.h"
#include "core/choice_lists.h"
#include "core/data_folder.h"
#include "core/natural_order.h"
#include "desktop/models/browser/folder_listing.h"
#include "metadata/exif/exif_source.h"
#include "metadata/exif/exif_walk.h"
#include "platform/files.h"
#include "platform/paths.h"
#include "platform/volumes.h"
#include "processing/faces/face_finder.h"
#include "processing/geometry/scale.h"
#include "registry/registry.h"

namespace fotomill::desktop {

namespace {

bool InDatabase(const ThumbnailRequest& request) {
  return request.mode == choice::kGlobalDatabase || request.mode == choice::kLocalDatabase;
}

ListedThumbnails& Listed() {
  static ListedThumbnails listed;
  return listed;
}

// With the filter of records, so that a cell looks the same when its copy is shown.
Status ScaleDown(const PackedImage& image, int32_t side, RgbImage& pixels) {
  if (image.Width() <= side && image.Height() <= side) return ToRgb(image, pixels);
  PackedImage scaled, noAlpha, noScaledAlpha;
  RETURN_IF_BAD(ScaleFiltered(image, noAlpha, FitSize(image.Width(), image.Height(), side),
                              ScaleFilter::Lanczos, scaled, noScaledAlpha));
  return ToRgb(scaled, pixels);
}

// Records are drawn in one of the three view sizes; smaller sides are scaled down.
Status PixelsOfRecord(const AnyThumbnailRecord& record, const ThumbnailRequest& request,
                      RgbImage& pixels) {
  const uint32_t flags = request.side > kSmallThumbnailSide        ? kDrawLargeView
                         : request.side <= kSmallThumbnailSide / 2 ? kDrawHalfSize
                                                                   : 0;
  PackedImage drawn;
  RETURN_IF_BAD(DrawThumbnailPicture(record, flags, request.options, drawn));
  return ScaleDown(drawn, request.side, pixels);
}

Status PixelsOfPicture(PictureRecord& picture, const ThumbnailRequest& request, RgbImage& pixels) {
  RETURN_IF_BAD(PrepareForDisplay(picture, request.options.matte));
  return ScaleDown(picture.image, request.side, pixels);
}

// Loads the thumbnail stored where the mode says. Records are too small for large squares and dense
// screens.
bool ReadReady(const ThumbnailRequest& request, Thumbnail& thumbnail) {
  const bool large = request.side > kSmallThumbnailSide;
  if (request.side <= kLargeThumbnailSide) {
    const auto record = std::make_unique<AnyThumbnailRecord>();
    const ThumbnailSources sources{.mode = static_cast<choice::ThumbnailMode>(request.mode),
                                   .listed = &Listed(),
                                   .databases = &SharedThumbnailStore(),
                                   .options = request.options};
    return LookUpThumbnail({request.path, request.modified, request.size, large}, sources,
                           *record) &&
           PixelsOfRecord(*record, request, thumbnail.pixels) == Status::Ok;
  }
  return false;
}

// Whether thumbnails that belong in files are also kept in the database of the data folder, as
// nobody may want the files. The detector of faces looks at pictures again each time.
bool KeepsCopy(const ThumbnailRequest& request) {
  return request.mode == choice::kDiskBased && request.options.keep &&
         !request.options.onFacesUnkept;
}

// Loads a thumbnail that was made earlier for a picture without a thumbnail file, by this program
// or by others.
bool ReadCopy(const ThumbnailRequest& request, Thumbnail& thumbnail) {
  ThumbnailRecord record;
  const bool fits = request.side <= kSmallThumbnailSide;
  if (fits && KeepsCopy(request) &&
      SharedThumbnailStore().Find(ThumbnailDatabasePath({}), request.path,
                                  PictureStampOf(request.modified, request.size), record))
    return PixelsOfRecord(record, request, thumbnail.pixels) == Status::Ok;
  const bool fromSystem = request.mode == choice::kDiskBased && request.options.fromSystem;
  const PicturePointer picture =
      fromSystem ? ReadSystemPicture(request.path, request.side) : nullptr;
  return picture != nullptr && PixelsOfPicture(*picture, request, thumbnail.pixels) == Status::Ok;
}

// Loads the EXIF thumbnail, upright like the picture.
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

// Reads the facts missing in a record from the file's header, which is fast.
void ReadFacts(const ThumbnailRequest& request, Thumbnail& thumbnail) {
  PicturePointer picture;
  if (LoadPictureInfo({.fileName = request.path, .options = request.options.read}, picture) ==
      Status::Ok)
    CopyFacts(*picture, thumbnail);
}

// Whether a new record of the picture is stored in this mode.
bool Keeps(const ThumbnailRequest& request) {
  return request.mode == choice::kVirtual || (InDatabase(request) && request.options.keep);
}

// The size at which to decode a picture, 0 for full size: enough for its record, even if the view
// is smaller. The quick scaler's result depends on the source size.
int32_t DecodedSide(const ThumbnailRequest& request, bool onFaces) {
  if (Keeps(request) && request.options.quick) return 0;
  return std::max({request.side, onFaces ? kFramingSide : 0,
                   Keeps(request) || KeepsCopy(request) ? kSmallThumbnailSide : 0});
}

void AddToDatabase(const std::string& database, const ThumbnailRequest& request,
                   const ThumbnailRecord& record) {
  SharedThumbnailStore().Add(database,
                             {record, request.path, VolumeKeyFor(request.path), false,
                              PictureStampOf(request.modified, request.size)},
                             request.options.hidden);
}

// Small pictures are shown in their own size, which a record does not have. A disk that is almost
// full is left to what matters more.
void KeepCopy(const ThumbnailRequest& request, const PictureRecord& picture) {
  constexpr uint64_t kLeastRoom = uint64_t{256} * 1024 * 1024;  // bytes
  const bool small = std::max(picture.width, picture.height) <= kSmallThumbnailSide;
  ThumbnailOptions options = request.options;
  options.quick = false;  // the picture may be decoded in a smaller size
  ThumbnailRecord record;
  if (!small && KeepsCopy(request) && platform::FreeSpace(DataFolder()) >= kLeastRoom &&
      MakeThumbnailRecord(record, picture, options))
    AddToDatabase(ThumbnailDatabasePath({}), request, record);
}

void KeepRecord(const ThumbnailRequest& request, const PictureRecord& picture) {
  ThumbnailRecord record;
  if (!Keeps(request) || !MakeThumbnailRecord(record, picture, request.options)) return;
  if (request.mode == choice::kVirtual)
    return Listed().Attach(request.path, PictureStampOf(request.modified, request.size), record);
  AddToDatabase(DatabaseForMode(static_cast<choice::ThumbnailMode>(request.mode), request.path),
                request, record);
}

Status MakeFromPicture(const ThumbnailRequest& request, Thumbnail& thumbnail) {
  PicturePointer picture;
  const bool onFaces =
      InDatabase(request) ? request.options.onFaces : request.options.onFacesUnkept;
  const ReadRequest read{
      .fileName = request.path,
      .thumbnailSide = DecodedSide(request, onFaces),
      .partial = true,
      .options = request.options.read};
  RETURN_IF_BAD(LoadPictureInfo(read, picture));
  CopyFacts(*picture, thumbnail);
  RETURN_IF_BAD(ReadPicture(read, *picture));
  thumbnail.partial = picture->shortfall != Status::Ok;
  if (onFaces)
    RETURN_IF_BAD(FrameOnFaces(*picture, request.options.faces, request.options.onAllFaces));
  RETURN_IF_BAD(PrepareForDisplay(*picture, request.options.matte));
  if (!thumbnail.partial) {
    KeepRecord(request, *picture);
    KeepCopy(request, *picture);
  }
  return ScaleDown(picture->image, request.side, thumbnail.pixels);
}

bool IsLeftOut(const ThumbnailRequest& request) {
  const int kind = static_cast<int>(platform::VolumeOf(request.path).kind);
  return (request.drivesLeftOut >> kind & 1) != 0;
}

// That of the first picture which has one; empty if there is none among the first few.
ThumbnailPointer LoadFolderThumbnail(const ThumbnailRequest& asked) {
  constexpr size_t kTried = 5;
  std::vector<FolderItem> items = ListForBrowser(asked.path, false, {}).items;
  std::erase_if(items, [](const FolderItem& item) { return item.folder; });
  const size_t tried = std::min(items.size(), kTried);
  std::partial_sort(
      items.begin(), items.begin() + static_cast<ptrdiff_t>(tried), items.end(),
      [](const FolderItem& a, const FolderItem& b) { return CompareNatural(a.name, b.name) < 0; });
  for (size_t i = 0; i < tried; ++i) {
    ThumbnailRequest request = asked;
    request.path = platform::JoinFolder(asked.path, items[i].name);
    request.folder = false;
    request.modified = 0;
    request.size = 0;
    ThumbnailPointer thumbnail = LoadThumbnail(request);
    if (thumbnail != nullptr && !thumbnail->pixels.Empty()) return thumbnail;
  }
  return std::make_shared<Thumbnail>();
}

}  // namespace

ThumbnailPointer LoadThumbnail(const ThumbnailRequest& asked) {
  if (asked.folder) return LoadFolderThumbnail(asked);
  ThumbnailRequest request = asked;
  auto thumbnail = std::make_shared<Thumbnail>();
  if (request.drivesLeftOut != 0 && IsLeftOut(request)) return thumbnail;
  if (request.modified == 0 && request.size == 0) {
    const platform::FileFacts facts = platform::FactsOf(request.path);
    thumbnail->status = Status::FileOpenError;
    if (facts.kind != platform::FileKind::Regular) return thumbnail;
    thumbnail->status = Status::Ok;
    request.modified = facts.modified;
    request.size = facts.size;
  }
  if (ReadReady(request, *thumbnail) || ReadCopy(request, *thumbnail)) {
    ReadFacts(request, *thumbnail);
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

void KeepThumbnailRecords() { SharedThumbnailStore().Flush(); }

Status WriteThumbnail(const std::string& path, const ThumbnailOptions& options) {
  ThumbnailRecord record;
  RETURN_IF_BAD(MakeThumbnailOfFile(path, options, record));
  return WriteThumbnailFile(record, ThumbnailPathFor(path), options.hidden)
             ? Status::Ok
             : Status::ErrorCreatingFile;
}

}  // namespace fotomill::desktop
