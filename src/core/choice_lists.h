#pragma once

#include <cstdint>

namespace fotomill {

// The numbers that choice keys hold. Codecs and processing compare the settings with these; a
// number outside its list is taken as the nearest one of the list.
namespace choice {

// JpegSubsample: how many pixels share one pair of color values.
enum JpegSubsampling : int32_t { kSubsample444 = 0, kSubsample422 = 1, kSubsample420 = 2 };
// JpegProcessor. The default, 2, is beyond the list and therefore means the last entry.
enum JpegEngine : int32_t { kJpegStandard = 0, kJpegFastest = 1 };
// TiffOptions: compression of the strips. CCITT (group 4) serves pictures of one bit; deeper ones
// get LZW instead.
enum TiffCompression : int32_t {
  kTiffNone = 0,
  kTiffPackBits = 1,
  kTiffCcitt = 2,
  kTiffDeflate = 3,
  kTiffLzw = 4,
  kTiffJpeg = 5,
};
// ICOCompression: which entries of an icon are PNG files instead of bitmaps.
enum IconCompression : int32_t { kIconBitmaps = 0, kIconPng256 = 1, kIconPngAlways = 2 };
// QuickTimeCodec: how movie frames are stored.
enum MovieCodec : int32_t { kMovieJpeg = 0, kMoviePng = 1 };
// PhotoCDResolution: the largest picture that is taken out of a Photo CD file.
enum PhotoCdSize : int32_t {
  kPhotoCd192 = 0,
  kPhotoCd384 = 1,
  kPhotoCd768 = 2,
  kPhotoCd1536 = 3,
  kPhotoCd3072 = 4
};
// ResizeFilter, ThumbnailZoomFilter: how pixels are computed when a picture changes its size.
enum ResampleFilter : int32_t { kBicubic = 0, kLanczos = 1, kBilinear = 2, kNearest = 3 };
// FXColorDither, FXMonoDither: how colors that a palette lacks are imitated. Without dithering each
// pixel becomes the nearest color; of black and white, the one on its side of FXThreshold (0: of
// the limit that parts the picture best). FXBidirectional makes error diffusion turn at the end of
// every row.
enum Dithering : int32_t { kDitherNone = 0, kDitherOrdered = 1, kDitherFloydSteinberg = 2 };
// FXMonomode: what color pictures become, black and white or FXGrayLevel shades of gray (0: all
// that the depth has).
enum MonoMode : int32_t { kMonoBlackWhite = 0, kMonoGray = 1 };
// FaceDetectThumbnailMultiple: what thumbnails that show faces show.
enum ShownFaces : int32_t { kLargestFace = 0, kAllFaces = 1 };
// ExtensionCaseStyle: letter case of written extensions.
enum ExtensionCase : int32_t { kCaseOfSource = 0, kCaseUpper = 1, kCaseLower = 2 };
// DefaultThumbnailMode and a folder's ThumbnailMode: where thumbnails live.
enum ThumbnailMode : int32_t {
  kDiskBased = 0,
  kVirtual = 1,
  kGlobalDatabase = 2,
  kLocalDatabase = 3
};
// DefaultViewMode and a folder's ViewMode: how a browser shows its files. The last three show
// thumbnails.
enum ViewMode : int32_t {
  kViewList = 0,
  kViewDetails = 1,
  kViewSmall = 2,
  kViewNormal = 3,
  kViewLarge = 4
};
// DefaultSortMode and a folder's SortMode.
enum SortMode : int32_t {
  kSortName = 0,
  kSortType = 1,
  kSortSize = 2,
  kSortDate = 3,
  kSortExifDate = 4,
  kSortDimensions = 5,
};
// DefaultViewZoom, by value: 1 to 12 are the percentages of the list.
enum ViewZoom : int32_t { kZoomActualSize = 7, kZoomFit = 13, kZoomFitWidth = 14, kZoomFill = 15 };
// DropOptions, by value: what files do that are dropped on a folder with no key held.
enum DropAction : int32_t { kDropMove = 101, kDropCopy = 102, kDropAsk = 103 };
// FileHistoryDateMode, ArchiveDateMode: civilian times have a.m. and p.m., military ones 24 hours.
enum DateMode : int32_t {
  kFullCivilian = 0,
  kFullMilitary = 1,
  kCompactCivilian = 2,
  kCompactMilitary = 3
};
// FileHistoryWindowType: what limits the file history.
enum HistoryLimit : int32_t { kLimitCount = 0, kLimitDays = 1 };
// FileHistoryThumbnailMode.
enum HistoryThumbnails : int32_t { kHistoryNoThumbnails = 0, kHistorySmall = 1, kHistoryLarge = 2 };
// FileHistorySortMode: a column of the history window.
enum HistoryColumn : int32_t {
  kColumnName = 0,
  kColumnType = 1,
  kColumnFunction = 2,
  kColumnCreated = 3,
  kColumnAccessed = 4,
  kColumnSize = 5,
  kColumnPath = 6,
};
// ExifDistinceUnits.
enum DistanceUnit : int32_t { kMiles = 0, kKilometres = 1 };
// InfoUnits, MattUnits, PrintWorkshopUnits.
enum LengthUnit : int32_t { kInches = 0, kCentimetres = 1, kPixels = 2 };
// MattBevelType: how a matte's inner edge is cut.
enum MattBevel : int32_t { kBevelSunken = 0, kBevelRaised = 1, kBevelNone = 2 };
// DetailSizeMode: how file sizes are shown.
enum SizeMode : int32_t { kSizeBytes = 0, kSizeKilobytes = 1, kSizeFitting = 2 };
// MDIClientBackground: MDIClientColor or MDIClientImage fills the frame.
enum FrameBackground : int32_t { kFrameColor = 0, kFramePicture = 1 };

}  // namespace choice

// One entry of a choice list: six words, of which a Setup dialog shows the first and the second is
// the value that keys of kind ValueChoice hold. A null text ends the list.
struct ChoiceEntry {
  const char* text;
  int32_t value;
  int32_t reserved[4];
};
static_assert(sizeof(void*) != 4 || sizeof(ChoiceEntry) == 24);  // six words, as plug-ins see it

// The list of each choice key in settings.def. The texts are what Setup dialogs show, in English.
extern const ChoiceEntry kBevelChoices[], kDateModeChoices[], kDistanceUnitChoices[], kDitherChoices[],
    kDropChoices[], kExtensionCaseChoices[], kFrameBackgroundChoices[], kHistoryLimitChoices[],
    kHistorySortChoices[], kHistoryThumbnailChoices[], kIconCompressionChoices[],
    kJpegProcessorChoices[], kJpegSubsampleChoices[], kLengthUnitChoices[], kMonoDitherChoices[],
    kFaceChoices[], kMonoModeChoices[], kMovieCodecChoices[], kPhotoCdChoices[], kResampleChoices[],
    kSizeModeChoices[], kSortModeChoices[], kThumbnailModeChoices[], kTiffCompressionChoices[],
    kViewModeChoices[], kViewZoomChoices[];

}  // namespace fotomill
