#include "settings/job_options.h"

#include <algorithm>

#include "catalog/history/file_history.h"
#include "catalog/thumbnails/thumbnail_update.h"
#include "files/file_time_change.h"
#include "metadata/exif/exif_text.h"
#include "metadata/gps.h"
#include "metadata/tags/picture_tags.h"
#include "picture/encode_options.h"
#include "picture/read_request.h"
#include "platform/clock.h"
#include "platform/file_times.h"
#include "processing/faces/face_options.h"
#include "processing/palette/reduce.h"
#include "settings/configuration.h"
#include "settings/key_table.h"
#include "settings/settings.h"

namespace fotomill {

namespace {

constexpr int32_t kWhole = 100;  // percent
constexpr int32_t kFewestGrays = 2, kMostGrays = 256;

Dither DitherFromKey(int32_t value) {
  return value == 0 ? Dither::None : value == 1 ? Dither::Ordered : Dither::FloydSteinberg;
}

}  // namespace

ReadOptions ReadOptionsFromSettings() {
  return {.alphaChannels = settings.UseAlphaChannels != 0,
          .recognizeApng = settings.RecognizeAPNG != 0,
          .alphaBackground = static_cast<uint32_t>(settings.AlphaBackground),
          .identify = {.on = settings.IdentifyMysteryViewFiles != 0,
                       .exceptions = std::string(settings.BatchIdentifyExceptions),
                       .mostSide = settings.MaximumMysteryFileDimension},
          .photoCdSize = settings.PhotoCDResolution,
          .textInverted = settings.InvertTextFiles != 0,
          .relaxedUuencode = settings.RelaxedUUE != 0};
}

EncodeOptions EncodeOptionsFromSettings() {
  return {.preserveMetadata = settings.PreserveEXIF != 0,
          .resolution = settings.TiffResolution,
          .bmpOs2 = settings.WriteOS2Bitmaps != 0,
          .gifInterlaced = settings.WriteGIFInterlaced != 0,
          .gif89 = settings.CreateGif89 != 0,
          .hdpCompression = settings.HDPCompression,
          .hdpBits = settings.HDPWriteOptions,
          .iconCompression = settings.ICOCompression,
          .iffCompressed = settings.CreateIffCompressed != 0,
          .iffPacked = settings.CreateIffPBM != 0,
          .jpegQuality = settings.JpegCompression,
          .jpegSubsampling = settings.JpegSubsample,
          .jpegProgressive = settings.WriteJpegProgressive != 0,
          .jpegStoresResolution = settings.JpegStoreDPI != 0,
          .macBinary = settings.CreateMacbinaryHeader != 0,
          .pngCompression = settings.PngCompression,
          .targa16 = settings.CreateTarga16 != 0,
          .textLevels = std::string(settings.TextCharacterLevels.view()),
          .textInverted = settings.InvertTextFiles != 0,
          .tiffCompression = settings.TiffOptions,
          .webpLossless = settings.WebPLossless != 0,
          .webpQuality = settings.WebPQualityFactor,
          .webpMixed = settings.WebPAllowMixed != 0};
}

ReduceOptions ReduceOptionsFromSettings() {
  const int32_t grays = settings.FXGrayLevel;
  return {.colorDither = DitherFromKey(settings.FXColorDither),
          .monoDither = DitherFromKey(settings.FXMonoDither),
          .serpentine = settings.FXBidirectional != 0,
          .grays = settings.FXMonomode != 0,
          .grayLevels = grays <= 0 ? 0 : std::clamp(grays, kFewestGrays, kMostGrays),
          .threshold = std::clamp(settings.FXThreshold, 0, 255),
          .brightness = std::clamp(settings.DitherBrightness, -kWhole, kWhole),
          .contrast = std::clamp(settings.DitherContrast, -kWhole, kWhole)};
}

ExifTextOptions ExifTextOptionsFromSettings() { return {.showTypes = settings.ExifShowTypes != 0}; }

choice::DistanceUnit DistanceUnitFromSettings() {
  return settings.ExifDistinceUnits == 0 ? choice::kMiles : choice::kKilometers;
}

bool GpsLocationFromSettings(GpsLocation& location) {
  return ParseGpsLocation(settings.ExifDefaultLocation, location);
}

HistoryOptions HistoryOptionsFromSettings() {
  return {.on = settings.FileHistoryEnable != 0,
          .offForGood = !IsForThisRun(KeyOf(KeyNumber::FileHistoryEnable)),
          .functions = static_cast<uint32_t>(settings.FileHistoryFunctions),
          .limitDays = settings.FileHistoryWindowType == choice::kLimitDays,
          .days = settings.FileHistoryWindowDays,
          .count = settings.FileHistoryWindowCount,
          .name = std::string(settings.FileHistoryDatabase)};
}

FaceOptions FaceOptionsFromSettings() {
  return {.cascade = std::string(settings.FaceDetectThumbnailCascade),
          .smallestPercent = settings.FaceDetectPercentage};
}

ThumbnailOptions ThumbnailOptionsFromSettings() {
  return {.quick = settings.ThumbnailQuickResize != 0,
          .matte = static_cast<Color>(settings.ThumbnailMatte),
          .hidden = settings.WriteHiddenThumbnails != 0,
          .fromFiles = settings.AlwaysUseTHN != 0,
          .fromSystem = settings.UseWindowsThumbnailCache != 0,
          .keep = settings.AutoCreateThumbnail != 0,
          .fastZoom = settings.FastZoomedThumbnails != 0,
          .zoomFilter = settings.ThumbnailZoomFilter,
          .onFaces = settings.FaceDetectThumbnailEnable != 0,
          .onFacesUnkept = settings.FaceDetectVirtualThumbnails != 0,
          .onAllFaces = settings.FaceDetectThumbnailMultiple != choice::kLargestFace,
          .faces = FaceOptionsFromSettings(),
          .read = ReadOptionsFromSettings()};
}

ThumbnailUpdateOptions ThumbnailUpdateOptionsFromSettings() {
  return {.offers = settings.UpdateThumbnailsFlag != 0,
          .choice = settings.UpdateThumbnailsOptions,
          .compacts = settings.UseThumbnailCompacting != 0,
          .compactionDays = settings.ThumbnailCompactInterval,
          .making = ThumbnailOptionsFromSettings()};
}

void StoreThumbnailUpdate(const ThumbnailUpdateOptions& options) {
  settings.UpdateThumbnailsOptions = options.choice;
  if (!options.offers) settings.UpdateThumbnailsFlag = 0;
}

TagSources TagSourcesFromSettings() {
  return {.commentFolder = std::string(settings.FileCommentPath.view()),
          .commentExtension = std::string(settings.TextCommentExtension.view())};
}

FileTimeRule FileTimeRuleFromSettings() {
  platform::LocalTime time;
  time.year = settings.FileTimeYear;
  time.month = settings.FileTimeMonth;
  time.day = settings.FileTimeDay;
  time.hour = settings.FileTimeHour;
  time.minute = settings.FileTimeMinute;
  time.second = settings.FileTimeSecond;
  const auto start = time.year > 0 ? platform::SecondsOfLocalTime(time) : std::nullopt;
  return {.start = start.value_or(platform::Now()),
          .increment = settings.FileTimeSequential != 0 ? settings.FileTimeIncrement : 0,
          .setsAccess = settings.FileTimeUpdateAccess != 0,
          .setsModification = settings.FileTimeUpdateWrite != 0};
}

bool WritesCommentsFromSettings() { return settings.WriteFileComments != 0; }

std::string CommentExtensionBesideFromSettings() {
  const bool beside = settings.FileCommentPath.view().empty();
  return std::string(beside ? settings.TextCommentExtension.view() : std::string_view());
}

}  // namespace fotomill
