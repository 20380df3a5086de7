#include "core/choice_lists.h"

namespace fotomill {

using namespace choice;

// clang-format off
#define CHOICES(list, ...) constinit const ChoiceEntry list[] = {__VA_ARGS__, {nullptr, 0, {}}}
#define CHOICE(text, value) {text, value, {}}

CHOICES(kJpegSubsampleChoices,
    CHOICE("None (4:4:4)",                    kSubsample444),
    CHOICE("Horizontal (4:2:2)",              kSubsample422),
    CHOICE("Horizontal and vertical (4:2:0)", kSubsample420));
CHOICES(kJpegProcessorChoices,
    CHOICE("IJG (standard)",          kJpegStandard),
    CHOICE("LibJPEG Turbo (fastest)", kJpegFastest));
CHOICES(kTiffCompressionChoices,
    CHOICE("None",                                      kTiffNone),
    CHOICE("PackBits",                                  kTiffPackBits),
    CHOICE("CCITT group 4 (black and white; else LZW)", kTiffCcitt),
    CHOICE("Deflate",                                   kTiffDeflate),
    CHOICE("LZW",                                       kTiffLzw),
    CHOICE("JPEG (loses detail)",                       kTiffJpeg));
CHOICES(kIconCompressionChoices,
    CHOICE("None",                     kIconBitmaps),
    CHOICE("PNG for 256 x 256 pixels", kIconPng256),
    CHOICE("PNG for all sizes",        kIconPngAlways));
CHOICES(kMovieCodecChoices,
    CHOICE("Motion JPEG", kMovieJpeg),
    CHOICE("PNG",         kMoviePng));
CHOICES(kPhotoCdChoices,
    CHOICE("192 x 128 pixels",   kPhotoCd192),
    CHOICE("384 x 256 pixels",   kPhotoCd384),
    CHOICE("768 x 512 pixels",   kPhotoCd768),
    CHOICE("1536 x 1024 pixels", kPhotoCd1536),
    CHOICE("3072 x 2048 pixels", kPhotoCd3072));
CHOICES(kResampleChoices,
    CHOICE("Bicubic",                  kBicubic),
    CHOICE("Lanczos (sharpest)",       kLanczos),
    CHOICE("Bilinear (soft)",          kBilinear),
    CHOICE("Nearest pixel (fastest)",  kNearest));
CHOICES(kDitherChoices,
    CHOICE("None (nearest color)",            kDitherNone),
    CHOICE("Ordered (regular pattern)",       kDitherOrdered),
    CHOICE("Floyd-Steinberg (most faithful)", kDitherFloydSteinberg));
CHOICES(kMonoDitherChoices,
    CHOICE("None (threshold)",                kDitherNone),
    CHOICE("Ordered (regular pattern)",       kDitherOrdered),
    CHOICE("Floyd-Steinberg (most faithful)", kDitherFloydSteinberg));
CHOICES(kMonoModeChoices,
    CHOICE("Black and white", kMonoBlackWhite),
    CHOICE("Shades of gray",  kMonoGray));
CHOICES(kFaceChoices,
    CHOICE("The largest face", kLargestFace),
    CHOICE("All faces",        kAllFaces));
CHOICES(kExtensionCaseChoices,
    CHOICE("As in the source file's name", kCaseOfSource),
    CHOICE("Upper case",                   kCaseUpper),
    CHOICE("Lower case",                   kCaseLower));
CHOICES(kThumbnailModeChoices,
    CHOICE("Disk-based",      kDiskBased),
    CHOICE("Virtual",         kVirtual),
    CHOICE("Global database", kGlobalDatabase),
    CHOICE("Local database",  kLocalDatabase));
CHOICES(kViewModeChoices,
    CHOICE("List",              kViewList),
    CHOICE("Details",           kViewDetails),
    CHOICE("Small thumbnails",  kViewSmall),
    CHOICE("Normal thumbnails", kViewNormal),
    CHOICE("Large thumbnails",  kViewLarge));
CHOICES(kSortModeChoices,
    CHOICE("Name",       kSortName),
    CHOICE("Type",       kSortType),
    CHOICE("Size",       kSortSize),
    CHOICE("Date",       kSortDate),
    CHOICE("EXIF date",  kSortExifDate),
    CHOICE("Dimensions", kSortDimensions));
CHOICES(kViewZoomChoices,
    CHOICE("10%",  1), CHOICE("20%",  2), CHOICE("25%",  3), CHOICE("33%",   4), CHOICE("50%",   5), CHOICE("75%",   6),
    CHOICE("100%", kZoomActualSize),
    CHOICE("150%", 8), CHOICE("200%", 9), CHOICE("300%", 10), CHOICE("400%", 11), CHOICE("800%", 12),
    CHOICE("Fit to window",     kZoomFit),
    CHOICE("Fit to width",      kZoomFitWidth),
    CHOICE("Fill the window",   kZoomFill));
CHOICES(kDropChoices,
    CHOICE("Move the files", kDropMove),
    CHOICE("Copy the files", kDropCopy),
    CHOICE("Ask each time",  kDropAsk));
CHOICES(kDateModeChoices,
    CHOICE("Full civilian",    kFullCivilian),
    CHOICE("Full military",    kFullMilitary),
    CHOICE("Compact civilian", kCompactCivilian),
    CHOICE("Compact military", kCompactMilitary));
CHOICES(kHistoryLimitChoices,
    CHOICE("Number of items",  kLimitCount),
    CHOICE("Days to remember", kLimitDays));
CHOICES(kHistoryThumbnailChoices,
    CHOICE("No thumbnails",    kHistoryNoThumbnails),
    CHOICE("Small thumbnails", kHistorySmall),
    CHOICE("Large thumbnails", kHistoryLarge));
CHOICES(kHistorySortChoices,
    CHOICE("Name",      kColumnName),
    CHOICE("Type",      kColumnType),
    CHOICE("Function",  kColumnFunction),
    CHOICE("Created",   kColumnCreated),
    CHOICE("Accessed",  kColumnAccessed),
    CHOICE("File size", kColumnSize),
    CHOICE("Path",      kColumnPath));
CHOICES(kDistanceUnitChoices,
    CHOICE("Miles",      kMiles),
    CHOICE("Kilometers", kKilometers));
CHOICES(kLengthUnitChoices,
    CHOICE("Inches",      kInches),
    CHOICE("Centimeters", kCentimeters),
    CHOICE("Pixels",      kPixels));
CHOICES(kBevelChoices,
    CHOICE("Sunken", kBevelSunken),
    CHOICE("Raised", kBevelRaised),
    CHOICE("None",   kBevelNone));
CHOICES(kSizeModeChoices,
    CHOICE("Bytes",             kSizeBytes),
    CHOICE("Kilobytes",         kSizeKilobytes),
    CHOICE("Most fitting unit", kSizeFitting));
CHOICES(kFrameBackgroundChoices,
    CHOICE("Color",   kFrameColor),
    CHOICE("Picture", kFramePicture));

#undef CHOICE
#undef CHOICES
// clang-format on

}  // namespace fotomill
