#pragma once

#include <cstdint>

namespace fotomill {

// The numeric values of choice keys, as codecs and processing compare them. A value out of range is
// clamped to the nearest entry of its list.
namespace choice {

// JpegSubsample: chroma subsampling.
enum JpegSubsampling : int32_t { kSubsample444 = 0, kSubsample422 = 1, kSubsample420 = 2 };
// JpegProcessor. The default, 2, is out of range and therefore means the last entry.
enum JpegEngine : int32_t { kJpegStandard = 0, kJpegFastest = 1 };
// TiffOptions: compression of the strips. CCITT (Group 4) is for bilevel pictures; deeper ones are
// written with LZW instead.
enum TiffCompression : int32_t {
  kTiffNone = 0,
  kTiffPackBits = 1,
  kTiffCcitt = 2,
  kTiffDeflate = 3,
  kTiffLzw = 4,
  kTiffJpeg = 5,
};
// ICOCompression: which icon entries are stored as PNG instead of as bitmaps.
enum IconCompression : int32_t { kIconBitmaps = 0, kIconPng256 = 1, kIconPngAlways = 2 };
// QuickTimeCodec: how movie frames are stored.
enum MovieCodec : int32_t { kMovieJpeg = 0, kMoviePng = 1 };
// PhotoCDResolution: the largest picture that is read from a Photo CD file.
enum PhotoCdSize : int32_t {
  kPhotoCd192 = 0,
  kPhotoCd384 = 1,
  kPhotoCd768 = 2,
  kPhotoCd1536 = 3,
  kPhotoCd3072 = 4
};
// ResizeFilter, ThumbnailZoomFilter: the resampling filter.
enum ResampleFilter : int32_t { kBicubic = 0, kLanczos = 1, kBilinear = 2, kNearest = 3 };
// FXColorDither, FXMonoDither: dithering when colors are reduced. Without it, each pixel becomes
// the nearest palette color; in black and white, it is compared with FXThreshold (0: the threshold
// that separates the picture best). FXBidirectional makes error diffusion reverse direction after
// every row.
enum Dithering : int32_t { kDitherNone = 0, kDitherOrdered = 1, kDitherFloydSteinberg = 2 };
// FXMonomode: what color pictures are reduced to, black and white or FXGrayLevel shades of gray (0:
// all that the bit depth allows).
enum MonoMode : int32_t { kMonoBlackWhite = 0, kMonoGray = 1 };
// FaceDetectThumbnailMultiple: which faces thumbnails show.
enum ShownFaces : int32_t { kLargestFace = 0, kAllFaces = 1 };
// ExtensionCaseStyle: letter case of the extensions of output files.
enum ExtensionCase : int32_t { kCaseOfSource = 0, kCaseUpper = 1, kCaseLower = 2 };
// DefaultThumbnailMode and a folder's ThumbnailMode: where thumbnails are stored.
enum ThumbnailMode : int32_t {
  kDiskBased = 0,
  kVirtual = 1,
  kGlobalDatabase = 2,
  kLocalDatabase = 3
};
// DefaultViewMode and a folder's ViewMode: how a browser lists files. The last
// three show thumbnails.
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
// DropOptions, by value: the action for files dropped on a folder without a modifier key.
enum DropAction : int32_t { kDropMove = 101, kDropCopy = 102, kDropAsk = 103 };
// FileHistoryDateMode, ArchiveDateMode: civilian times use a.m. and p.m., military ones 24 hours.
enum DateMode : int32_t {
  kFullCivilian = 0,
  kFullMilitary = 1,
  kCompactCivilian = 2,
  kCompactMilitary = 3
};
// FileHistoryWindowType: whether the file history is limited by count or by age.
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
enum DistanceUnit : int32_t { kMiles = 0, kKilometers = 1 };
// InfoUnits, MattUnits, PrintWorkshopUnits.
enum LengthUnit : int32_t { kInches = 0, kCentimeters = 1, kPixels = 2 };
// MattBevelType: bevel of a matte's inner edge.
enum MattBevel : int32_t { kBevelSunken = 0, kBevelRaised = 1, kBevelNone = 2 };
// DetailSizeMode: how file sizes are shown.
enum SizeMode : int32_t { kSizeBytes = 0, kSizeKilobytes = 1, kSizeFitting = 2 };
// MDIClientBackground: MDIClientColor or MDIClientImage fills the frame.
enum FrameBackground : int32_t { kFrameColor = 0, kFramePicture = 1 };

}  // namespace choice

// One entry of a choice list, six words. Setup dialogs show the first; the second is the value
// stored by keys of kind ValueChoice. A null text ends the list.
struct ChoiceEntry {
  const char* text;
  int32_t value;
  int32_t reserved[4];
};
static_assert(sizeof(void*) != 4 || sizeof(ChoiceEntry) == 24);  // six words, the plug-in ABI

// The list of each choice key in settings.def. Setup dialogs show the texts, in English.
extern const ChoiceEntry kBevelChoices[], kDateModeChoices[], kDistanceUnitChoices[], kDitherChoices[],
    kDropChoices[], kExtensionCaseChoices[], kFrameBackgroundChoices[], kHistoryLimitChoices[],
    kHistorySortChoices[], kHistoryThumbnailChoices[], kIconCompressionChoices[],
    kJpegProcessorChoices[], kJpegSubsampleChoices[], kLengthUnitChoices[], kMonoDitherChoices[],
    kFaceChoices[], kMonoModeChoices[], kMovieCodecChoices[], kPhotoCdChoices[], kResampleChoices[],
    kSizeModeChoices[], kSortModeChoices[], kThumbnailModeChoices[], kTiffCompressionChoices[],
    kViewModeChoices[], kViewZoomChoices[];

}  // namespace fotomill
