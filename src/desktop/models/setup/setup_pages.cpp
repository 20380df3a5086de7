#include "desktop/models/setup/setup_pages.h"

#include <algorithm>
#include <iterator>
#include <string>

#include "core/text.h"
#include "desktop/models/setup/setup_help.h"
#include "processing/faces/face_finder.h"
#include "processing/faces/face_options.h"
#include "registry/registry.h"
#include "settings/job_options.h"
#include "texts/texts.h"

namespace fotomill::desktop {

namespace {

using enum SetupPage;
using enum KeyNumber;

constexpr SetupItem Item(SetupPage page, const char* group, KeyNumber key, const char* label) {
  return {page, group, key, label};
}

// clang-format off
constexpr SetupItem kItems[] = {
    Item(Browsing,   TrLater("Start"),              RememberOpenWindows,            "Reopen the tabs of the last session"),
    Item(Browsing,   TrLater("Start"),              NewBrowserMyPictures,           "Otherwise start in the pictures folder"),
    Item(Browsing,   TrLater("Start"),              ShowStartupWindow,              "Show a startup window"),
    Item(Browsing,   TrLater("Start"),              LogoDelay,                      "Display time in milliseconds"),
    Item(Browsing,   TrLater("Start"),              ShowWelcomeWizard,              "Show the welcome at the next start"),
    Item(Browsing,   TrLater("Text sizes"),         NormalTextFontSize,             "Lists and reports; 10 is the size of the system"),
    Item(Browsing,   TrLater("Text sizes"),         SmallTextFontSize,              "Notes; 8 is the size of the system"),
    Item(Browsing,   TrLater("Text sizes"),         NormalThumbFontSize,            "Names below thumbnails; 8 is the size of the system"),
    Item(Browsing,   TrLater("Text sizes"),         LargeThumbFontSize,             "Names below large thumbnails; 10 is the size of the system"),
    Item(Browsing,   TrLater("New browsers"),       DefaultViewMode,                "Show files as"),
    Item(Browsing,   TrLater("New browsers"),       DefaultSortMode,                "Sort by"),
    Item(Browsing,   TrLater("New browsers"),       DefaultThumbnailMode,           "Thumbnails come from"),
    Item(Browsing,   TrLater("Folders"),            UseFolderOverrides,             "Remember the view of each folder"),
    Item(Browsing,   TrLater("Folders"),            WatchFolders,                   "Watch folders for changes"),
    Item(Browsing,   TrLater("File list"),      TabbedBarEnable,                "Show the tabs if there are several"),
    Item(Browsing,   TrLater("File list"),      ClearAllOnBlankClick,           "A click on empty space clears the selection"),
    Item(Browsing,   TrLater("File list"),      FileTipShow,                    "Show a tooltip with file information"),
    Item(Browsing,   TrLater("File list"),      DetailSizeMode,                 "File sizes in"),
    Item(Browsing,   TrLater("Files"),              DropOptions,                    "When files are dropped on a folder"),
    Item(Browsing,   TrLater("Files"),              PromptBeforeMoving,             "Ask before dropped files are moved"),
    Item(Browsing,   TrLater("Files"),              DeleteShowPreview,              "Show thumbnails before files are deleted permanently"),
    Item(Browsing,   TrLater("Files"),              UndoLevels,                     "Undo steps"),
    Item(Browsing,   TrLater("Files"),              NewFolderName,                  "Name of new folders"),
    Item(Browsing,   TrLater("Files"),              ClipboardPictureName,           "Name of pictures from the clipboard"),
    Item(Browsing,   TrLater("Toolbar"),            RightClickOneTimeFunctions,     "Operations chosen by right click are used only once"),
    Item(Browsing,   TrLater("Find similar"),       FindSimlarDistance,             "How many of 64 bits may differ, 0 to 32"),
    Item(Browsing,   TrLater("Find similar"),       FindSimilarTransforms,          "Also find pictures that are rotated or mirrored"),
    Item(Browsing,   TrLater("Find similar"),       FindSimilarSubfolders,          "Also search subfolders"),
    Item(Browsing,   TrLater("Recently used"), CopyHistoryMax,        "Folders copied or moved to"),
    Item(Browsing,   TrLater("Recently used"), DestHistoryMax,        "Destination folders"),
    Item(Browsing,   TrLater("Recently used"), PictureSearchHistoryMax,    "Folders that were searched"),
    Item(Browsing,   TrLater("Recently used"), RecentFilesMaximum,    "Files in the File menu"),
    Item(Browsing,   TrLater("Recently used"), EditListMaximum,       "Base names of sequential renaming"),
    Item(Thumbnails, TrLater("Creating"),             BrowserThumbnailPrecacheEnable, "Also create thumbnails of files that are not visible"),
    Item(Thumbnails, TrLater("Creating"),             BrowserThumbnailPrecacheDelay,  "Milliseconds to wait after scrolling"),
    Item(Thumbnails, TrLater("Creating"),             ThumbnailQuickResize,           "Prefer speed over quality when scaling"),
    Item(Thumbnails, TrLater("Creating"),             ThumbnailZoomFilter,            "Scaling filter"),
    Item(Thumbnails, TrLater("Creating"),             ThumbnailMatte,                 "Background color"),
    Item(Thumbnails, TrLater("Creating"),             FastZoomedThumbnails,           "Prefer speed over quality for large thumbnails"),
    Item(Thumbnails, TrLater("Creating"),             AutoCreateThumbnail,            "Keep new thumbnails in the database"),
    Item(Thumbnails, TrLater("Creating"),             UpdateThumbnailsFlag,           "Offer to create thumbnail files"),
    Item(Thumbnails, TrLater("Lists"),              AlternateFolderGraphics,        "Plain folders, without a picture from inside"),
    Item(Thumbnails, TrLater("Lists"),              ShowDetailListThumbnails,       "Small thumbnails in the Details view"),
    Item(Thumbnails, TrLater("Faces"),              FaceDetectThumbnailEnable,      "Show the face in stored thumbnails"),
    Item(Thumbnails, TrLater("Faces"),              FaceDetectVirtualThumbnails,    "Show the face in thumbnails that are not stored"),
    Item(Thumbnails, TrLater("Faces"),              FaceDetectThumbnailMultiple,    "Which faces"),
    Item(Thumbnails, TrLater("Faces"),              FaceDetectPercentage,           "Smallest face, percent of the picture"),
    Item(Thumbnails, TrLater("Faces"),              FaceDetectThumbnailCascade,     "Classifier"),
    Item(Thumbnails, TrLater("Storing"),            AlwaysUseTHN,                   "Also use thumbnail files in the database modes"),
    Item(Thumbnails, TrLater("Storing"),            UseWindowsThumbnailCache,       "Use the system's thumbnail cache"),
    Item(Thumbnails, TrLater("Storing"),            WriteHiddenThumbnails,          "Hide thumbnail files and databases"),
    Item(Thumbnails, TrLater("Storing"),            UseThumbnailCompacting,         "Delete thumbnail files without a picture"),
    Item(Thumbnails, TrLater("Storing"),            ThumbnailCompactInterval,       "Days between clean-ups"),
    Item(Viewing,    TrLater("Size"),               DefaultViewZoom,                "Open pictures at"),
    Item(Viewing,    TrLater("Size"),               OptimumZoomNoUpsize,            "Never enlarge to fit"),
    Item(Viewing,    TrLater("Size"),               ResizeFilter,                   "Scaling filter"),
    Item(Viewing,    TrLater("Size"),               ViewModeKeepZoom,               "Keep zoom and position between pictures"),
    Item(Viewing,    TrLater("Picture"),            ExifAdjustOrientation,          "Rotate pictures upright by EXIF orientation"),
    Item(Viewing,    TrLater("Picture"),            ViewModeColorProfiles,          "Apply color profiles of pictures"),
    Item(Viewing,    TrLater("Picture"),            ViewModeCheckerboard,           "Show transparency as a checkerboard"),
    Item(Viewing,    TrLater("Picture"),            UseAlphaChannels,               "Read the alpha channel of bitmaps (BMP)"),
    Item(Viewing,    TrLater("Picture"),            RecognizeAPNG,                  "Recognize animated PNG files"),
    Item(Viewing,    TrLater("Animations"),         AnimationViewModeProgressBar,   "Show the progress of animations"),
    Item(Viewing,    TrLater("Animations"),         AnimationViewModeToolbar,       "Show buttons below animations"),
    Item(Viewing,    TrLater("Window"),             ShowProgressWhenViewing,        "Show how far a picture is loaded"),
    Item(Viewing,    TrLater("Window"),             ViewModeBackground,             "Background color"),
    Item(Viewing,    TrLater("Window"),             ViewModeFullScreenBackground,   "Background color in full screen"),
    Item(Viewing,    TrLater("Window"),             ViewModeFilmStrip,              "Show a film strip in the bar over the picture"),
    Item(Viewing,    TrLater("Window"),             MaximizeViewWindow,             "Open view windows maximized"),
    Item(Viewing,    TrLater("Window"),             RightClickMenuInView,           "Right click opens a menu"),
    Item(Viewing,    TrLater("Crop window"),        RightClickMenuInCrop,           "Right click opens a menu"),
    Item(Viewing,    TrLater("Crop window"),        CropModeExact,                  "Keep the size of the rectangle, only move it"),
    Item(Viewing,    TrLater("Window"),             PromptDeleteFromView,           "Ask before a picture is moved to the trash"),
    Item(Batches,    TrLater("Before"),             WarnDestinationWrite,           "Ask before converting to another format"),
    Item(Batches,    TrLater("Before"),             AllowDestinationOverrides,      "Shift at the destination step opens the format options"),
    Item(Batches,    TrLater("Before"),             PromptForDestination,           "Ask for the destination folder"),
    Item(Batches,    TrLater("Before"),             DestinationWindowCombined,      "Ask for format and folder in one window"),
    Item(Batches,    TrLater("Before"),             PromptForFileComments,          "Ask for a comment for the new files"),
    Item(Batches,    TrLater("Progress"),           CloseProgressWhenDone,          "Close the progress window if there were no errors"),
    Item(Batches,    TrLater("Progress"),           ProgressOptimizeWindow,         "Make the progress window as tall as the main window"),
    Item(Batches,    TrLater("Progress"),           ProgressThumbnails,             "Show thumbnails in the progress window"),
    Item(Batches,    TrLater("Progress"),           ProgressShowMissingThumbnails,  "Reserve space for missing thumbnails"),
    Item(Batches,    TrLater("Progress"),           ProgressRaiseAppWindow,         "Bring the program to the front when done"),
    Item(Batches,    TrLater("Existing files"), PromptBeforeOverwrite,        "Ask before a file is replaced"),
    Item(Batches,    TrLater("Existing files"), OverwriteKeepBoth,            "Keep both files"),
    Item(Batches,    TrLater("Existing files"), OverwritePromptPreviews,      "Show previews when asking"),
    Item(Batches,    TrLater("Existing files"), OverwritePromptRecycle,       "Move replaced files to the trash"),
    Item(Batches,    TrLater("Sizes of Resize (width,height)"), Transform320,       "First"),
    Item(Batches,    TrLater("Sizes of Resize (width,height)"), Transform640,     "Second"),
    Item(Batches,    TrLater("Sizes of Resize (width,height)"), Transform800,     "Third"),
    Item(Batches,    TrLater("Sizes of Resize (width,height)"), Transform1024,    "Fourth"),
    Item(Batches,    TrLater("Sizes of Resize (width,height)"), Transform1280,    "Fifth"),
    Item(Saving,     TrLater("New files"),          DefaultFileExtension,           "Default format"),
    Item(Saving,     TrLater("New files"),          UseDefaultDestFormat,           "Always offer the default format first"),
    Item(Saving,     TrLater("New files"),          PreserveEXIF,                   "Keep EXIF, XMP and comments"),
    Item(Saving,     TrLater("New files"),          CreateBackups,                  "Keep a copy beside each file that Edit changes"),
    Item(Saving,     TrLater("New files"),          WriteFileComments,              "Write comments to text files, and to files of plug-in formats"),
    Item(Saving,     TrLater("New files"),          FileCommentPath,                "Folder of comment files; empty: beside the pictures"),
    Item(Saving,     TrLater("New files"),          TextCommentExtension,           "Extension of comment files"),
    Item(Saving,     TrLater("New files"),          PasswordProtect,                "Protect files with a password if the format supports it"),
    Item(Saving,     TrLater("New files"),          TiffResolution,                 "Resolution of pictures without one (dots per inch)"),
    Item(Saving,     TrLater("New files"),          AlphaBackground,                "Background color if the format has no transparency"),
    Item(Names,      TrLater("Location"),              DestForceSourceDir,             "Write next to the source file"),
    Item(Names,      TrLater("Names"),              PromptForDestName,              "Ask for each file name"),
    Item(Names,      TrLater("Names"),              ExtensionCaseStyle,             "Case of extensions"),
    Item(Names,      TrLater("Sequential renaming"), SequentialRenameBaseName,      "Base name"),
    Item(Names,      TrLater("Sequential renaming"), SequentialRenameBaseNumber,    "First number"),
    Item(Names,      TrLater("Sequential renaming"), SequentialRenameIncrement,     "Increment"),
    Item(Names,      TrLater("Sequential renaming"), SequentialRenamePrefix,        "Number before the name"),
    Item(Names,      TrLater("Sequential renaming"), SequentialRenameHyphen,        "Separator between name and number"),
    Item(Names,      TrLater("Sequential renaming"), SequentialRenameSep,           "Separator"),
    Item(Names,      TrLater("Sequential renaming"), SequentialRenameRandom,        "Random order"),
    Item(Names,      TrLater("Sequential renaming"), SequentialRenameSkipCollide,   "Skip numbers whose name is taken"),
    Item(Names,      TrLater("Sequential renaming"), SequentialRenameMaxAttempts,   "Maximum number of attempts"),
    Item(Names,      TrLater("Sequential renaming"), SequentialRenameUpdate,        "Continue counting with the next renaming"),
    Item(Names,      TrLater("Contact sheets"),     PrefixCatalog,                  "File name prefix"),
    Item(Names,      TrLater("Contact sheets"),     CatalogFontName,                "Caption font"),
    Item(Names,      TrLater("Prefixes of results"), FilenameUnderbars,              "Underscores in prefixes"),
    Item(Names,      TrLater("Prefixes of results"), PrefixCrop,                     "Crop"),
    Item(Names,      TrLater("Prefixes of results"), PrefixTransform,                "Transform"),
    Item(Names,      TrLater("Prefixes of results"), PrefixEffects,                  "Effects"),
    Item(Names,      TrLater("Prefixes of results"), PrefixFilter,                   "Filters"),
    Item(Names,      TrLater("Prefixes of results"), PrefixAnnotate,                 "Captions and text"),
    Item(Names,      TrLater("Prefixes of results"), PrefixWatermark,                "Watermarks"),
    Item(Names,      TrLater("Prefixes of results"), PrefixMatt,                     "Mattes"),
    Item(Names,      TrLater("Prefixes of results"), PrefixDuplicate,                "Copies in the same folder"),
    Item(Colors,     TrLater("Color reduction"),       FXColorDither,                  "Dithering"),
    Item(Colors,     TrLater("Color reduction"),       FXBidirectional,                "Alternate direction of rows"),
    Item(Colors,     TrLater("Color reduction"),       DitherBrightness,               "Brightness adjustment"),
    Item(Colors,     TrLater("Color reduction"),       DitherContrast,                 "Contrast adjustment"),
    Item(Colors,     TrLater("Color reduction"),       ColourTableFile,                "Color table file"),
    Item(Colors,     TrLater("Monochrome"),     FXMonomode,                     "Convert to"),
    Item(Colors,     TrLater("Monochrome"),     FXMonoDither,                   "Dithering"),
    Item(Colors,     TrLater("Monochrome"),     FXThreshold,                    "White threshold; 0 is automatic"),
    Item(Colors,     TrLater("Monochrome"),     FXGrayLevel,                    "Shades of gray; 0 for all"),
    Item(Colors,     TrLater("Effects"),        FXBrightness,                   "Initial brightness"),
    Item(Colors,     TrLater("Effects"),        FXContrast,                     "Initial contrast"),
    Item(Captions,   TrLater("Captions"),          AnnotateText,                  "Text"),
    Item(Captions,   TrLater("Captions"),          AnnotateFontName,              "Font"),
    Item(Captions,   TrLater("Captions"),          AnnotatePointSizeFont,         "Font size in points"),
    Item(Captions,   TrLater("Captions"),          AnnotateForeground,            "Text color"),
    Item(Captions,   TrLater("Captions"),          AnnotateBackground,            "Background color"),
    Item(Captions,   TrLater("Captions"),          AnnotatePadding,               "Space around the text, in pixels"),
    Item(Captions,   TrLater("Captions"),          AnnotateLinespace,             "Extra space between lines, in pixels"),
    Item(Captions,   TrLater("Captions"),          AnnotateCharspace,             "Extra space between characters, in pixels"),
    Item(Captions,   TrLater("Captions"),          AnnotateFrame,                 "Draw a frame"),
    Item(Captions,   TrLater("Captions"),          AnnotateBorderFrameSize,       "Width of the frame, in pixels"),
    Item(Captions,   TrLater("Text in pictures"),  AnnotateExFontName,            "Font"),
    Item(Captions,   TrLater("Text in pictures"),  AnnotateExPointSizeFont,       "Font size in points"),
    Item(Captions,   TrLater("Text in pictures"),  AnnotateExForeground,          "Text color"),
    Item(Captions,   TrLater("Text in pictures"),  AnnotateExBackground,          "Color of the box"),
    Item(Captions,   TrLater("Text in pictures"),  AnnotateExPadding,             "Space around the text, in pixels"),
    Item(Captions,   TrLater("Text in pictures"),  AnnotateExFrame,               "Draw a frame"),
    Item(Captions,   TrLater("Text in pictures"),  AnnotateExBorderFrameSize,     "Width of the frame, in pixels"),
    Item(Captions,   TrLater("Watermarks"),        WatermarkText,                 "Text"),
    Item(Captions,   TrLater("Watermarks"),        WatermarkFontName,             "Font"),
    Item(Captions,   TrLater("Watermarks"),        WatermarkImagePath,            "Picture instead of the text"),
    Item(Captions,   TrLater("Mattes"),            MattSize,                      "Width"),
    Item(Captions,   TrLater("Mattes"),            MattUnits,                     "Unit of the width"),
    Item(Captions,   TrLater("Mattes"),            MattFillColor,                 "Color"),
    Item(Captions,   TrLater("Mattes"),            MattUseTexture,                "Use a texture"),
    Item(Captions,   TrLater("Mattes"),            TextureImagePath,              "Picture of the texture"),
    Item(Captions,   TrLater("Mattes"),            MattBevelType,                 "Bevel"),
    Item(Captions,   TrLater("Mattes"),            MattBevelSize,                 "Width of the bevel, in pixels"),
    Item(Captions,   TrLater("Mattes"),            MattIntensity,                 "Contrast of the bevel, 0 to 100"),
    Item(Captions,   TrLater("Mattes"),            MattUseInnerBorder,            "Draw an inner border"),
    Item(Captions,   TrLater("Mattes"),            MattInnerBorderSize,           "Width of the inner border, in pixels"),
    Item(Captions,   TrLater("Mattes"),            MattInnerBorderColor,          "Color of the inner border"),
    Item(Captions,   TrLater("Mattes"),            MattUseOuterBorder,            "Draw an outer border"),
    Item(Captions,   TrLater("Mattes"),            MattOuterBorderSize,           "Width of the outer border, in pixels"),
    Item(Captions,   TrLater("Mattes"),            MattOuterBorderColor,          "Color of the outer border"),
    Item(Printing,   TrLater("Window"), PhotoPrnPreview, "Show a preview of the pages"),
    Item(Printing,   TrLater("Texts"), PrintFontName, "Font"),
    Item(Printing,   TrLater("Texts"), PrintFontSize, "Font size in points"),
    Item(Printing,   TrLater("Single prints"), PrintTitleText, "Title"),
    Item(Printing,   TrLater("Single prints"), PrintWorkshopComment, "Comment"),
    Item(Printing,   TrLater("Single prints"), PrintBrightness, "Brightness, -100 to 100"),
    Item(Printing,   TrLater("Single prints"), PrintContrast, "Contrast, -100 to 100"),
    Item(Printing,   TrLater("Single prints"), PrintBackground, "Page color"),
    Item(Printing,   TrLater("Single prints"), PrintWorkshopMattColor, "Color of the border"),
    Item(Printing,   TrLater("Single prints"), PrintWorkshopRuleColor, "Color of the line"),
    Item(Printing,   TrLater("Single prints"), PrintWorkshopRuleShade, "Draw a shadow of the line"),
    Item(Printing,   TrLater("Single prints"), PrintWorkshopPrepress, "Print register marks"),
    Item(Printing,   TrLater("Single prints"), PrintIntegral, "Whole numbers of dots per pixel"),
    Item(Printing,   TrLater("Single prints"), ExpandPrintedHalftones, "The same for black-and-white pictures only"),
    Item(Printing,   TrLater("Photo prints"), PhotoPrnCutlineColor, "Color of the cut lines"),
    Item(Printing,   TrLater("Catalog"), GrafcatFontName, "Font"),
    Item(Printing,   TrLater("Catalog"), GrafcatFrameTitle, "Names in a bar above the pictures"),
    Item(Printing,   TrLater("Catalog"), GrafcatBackground, "Page color"),
    Item(Printing,   TrLater("Poster"), PrintPosterCutlineColor, "Color of the cut lines"),
    Item(Printing,   TrLater("Cube and dodecahedron"), PrintDodecDashedLines, "Dash the lines to fold along"),
    Item(Printing,   TrLater("Cube and dodecahedron"), PrintDodecForeground, "Color of the lines"),
    Item(Printing,   TrLater("Cube and dodecahedron"), PrintDodecBackground, "Page color"),
    Item(Metadata,   TrLater("EXIF"),               ExifShowTypes,                  "Show value types"),
    Item(Metadata,   TrLater("Edit EXIF"),          ExifConfirmWrite,               "Ask before values are written"),
    Item(Metadata,   TrLater("Edit EXIF"),          ExifConfirmAddNew,              "Ask before tags are added"),
    Item(Metadata,   TrLater("Remove metadata"),    SecureEXIFPrompt,               "Ask what to remove"),
    Item(Metadata,   TrLater("Remove metadata"),    SecureEXIFPreview,              "Show what is removed and what is left"),
    Item(Metadata,   TrLater("Owner values"),       ExifPersonWhoCreatedImage,      "Person who created the image"),
    Item(Metadata,   TrLater("Owner values"),       ExifCopyrightHolder,            "Copyright holder"),
    Item(Metadata,   TrLater("Owner values"),       ExifCameraOwnerName,            "Camera owner name"),
    Item(Metadata,   TrLater("Owner values"),       ExifSoftwareName,               "Software used"),
    Item(Metadata,   TrLater("Owner values"),       ExifEquipmentManufacturer,      "Manufacturer of the camera"),
    Item(Metadata,   TrLater("Owner values"),       ExifEquipmentModel,             "Camera model"),
    Item(Metadata,   TrLater("Owner values"),       ExifNewImageTitle,              "Image title"),
    Item(Metadata,   TrLater("Places"),             ExifDefaultLocation,            "Default location"),
    Item(Metadata,   TrLater("Places"),             ExifLocationsFile,              "List of places"),
    Item(Metadata,   TrLater("Places"),             ExifDistinceUnits,              "Unit of distances"),
    Item(Metadata,   TrLater("Get info"),           InfoUnits,                      "Unit of print sizes"),
    Item(Metadata,   TrLater("Get info"),           InfoResolution,                 "Assumed resolution for print sizes (dots per inch)"),
    Item(Archives,   TrLater("Extracting"),         ArchivePreservePaths,           "Keep the folders of the archive"),
    Item(Archives,   TrLater("Extracting"),         ArchivePreserveTimestamps,      "Keep file times"),
    Item(Archives,   TrLater("Extracting"),         ArchivePromptOverwrite,         "Ask before a file is replaced"),
    Item(Archives,   TrLater("Extracting"),         ArchiveExtractPath,             "Folder; empty: the folder of the archive"),
    Item(Archives,   TrLater("Extracting"),         ArchiveHistoryMax,              "Folders to remember"),
    Item(Archives,   TrLater("Creating archives"),  ArchiveAddThumbnails,           "Include thumbnail files"),
    Item(Archives,   TrLater("Creating archives"),  ArchiveMaskPassword,            "Hide passwords while typing"),
    Item(Archives,   TrLater("Archive manager"),    EscalatePicturelessZips,        "Open archives without pictures in the archive manager"),
    Item(Archives,   TrLater("Archive manager"),    ArchivePromptExternal,          "Ask before a file is opened with another program"),
    Item(Archives,   TrLater("Archive manager"),    ArchiveDateMode,                "Dates"),
    Item(Archives,   TrLater("Archive manager"),    ArchiveListRuleEnable,          "Lines between rows"),
    Item(History,    TrLater("Remember"),           FileHistoryEnable,              "Record recently used files"),
    Item(History,    TrLater("Remember"),           FileHistoryFunctions,           "For these functions"),
    Item(History,    TrLater("Remember"),           FileHistoryWindowType,          "Limit by"),
    Item(History,    TrLater("Remember"),           FileHistoryWindowCount,         "Number of items"),
    Item(History,    TrLater("Remember"),           FileHistoryWindowDays,          "Days to remember"),
    Item(History,    TrLater("List"),               FileHistoryThumbnailMode,       "Thumbnails"),
    Item(History,    TrLater("List"),               FileHistoryDateMode,            "Dates"),
    Item(History,    TrLater("List"),               FileHistoryListRuleEnable,      "Lines between rows"),
    Item(History,    TrLater("List"),               FileHistoryRemovePrompt,        "Ask before removing entries"),
    Item(History,    TrLater("File"),               FileHistoryDatabase,            "Name of the history file"),
    Item(Formats,    TrLater("Wrong names"),        IdentifyMysteryViewFiles,       "Open files by their contents if the name is wrong"),
    Item(Formats,    TrLater("Wrong names"),        BatchIdentifyExceptions,        "Except files with these extensions"),
    Item(Formats,    TrLater("Plug-ins"),           AllowPluginFormatOverride,      "Plug-ins may replace disabled formats"),
};
// clang-format on

constexpr const char* kTitles[] = {
    TrLater("Browsing"), TrLater("Thumbnails"), TrLater("Viewing"), TrLater("Batches"),
    TrLater("Saving"), TrLater("Format options"), TrLater("File names"), TrLater("Colors"),
    TrLater("Captions and mattes"), TrLater("Printing"), TrLater("EXIF and info"),
    TrLater("Archives"), TrLater("File history"), TrLater("Formats"), TrLater("Keyboard")};
static_assert(std::size(kTitles) == kSetupPageCount);

consteval bool EveryItemIsShownOnce() {
  for (size_t i = 0; i < std::size(kItems); ++i) {
    for (size_t j = i + 1; j < std::size(kItems); ++j) {
      if (kItems[i].key == kItems[j].key) return false;
    }
    if (i > 0 && kItems[i].page < kItems[i - 1].page) return false;
  }
  return true;
}
static_assert(EveryItemIsShownOnce());

// The rows above, but those of faces only if the detector is installed, plus a page with the
// settings of formats, one group per format.
std::vector<SetupItem> WithSettingsOfFormats() {
  std::vector<SetupItem> items(std::begin(kItems), std::end(kItems));
  if (!CanFindFaces({}) && !CanFindFaces(FaceOptionsFromSettings())) {
    std::erase_if(items,
                  [](const SetupItem& item) { return item.group == std::string_view("Faces"); });
  }
  auto place =
      std::ranges::find_if(items, [](const SetupItem& item) { return item.page > FormatOptions; });
  for (const FormatSettings* const codec : SettingsOfFormats()) {
    for (const FormatSetting& setting : codec->keys) {
      const KeyRow* const row = FindKey(setting.key);
      if (row == nullptr || *setting.label == '\0') continue;
      place = items.insert(place, {FormatOptions, codec->group,
                                   static_cast<KeyNumber>(NumberOfKey(*row)), setting.label}) +
              1;
    }
  }
  return items;
}

std::string SearchedText(const SetupItem& item) {
  const char* const name = KeyOf(item.key).name;
  std::string text = std::string(Tr(TitleOf(item.page))) + " " + Tr(item.group) + " " +
                     Tr(item.label) + " " + name;
  return LowerCase(text.append(" ").append(HelpOn(name).text));
}

}  // namespace

const char* TitleOf(SetupPage page) { return kTitles[static_cast<size_t>(page)]; }

std::span<const SetupItem> SetupItems() {
  static const std::vector<SetupItem> items = WithSettingsOfFormats();
  return items;
}

std::vector<SetupItem> ItemsOf(SetupPage page) {
  std::vector<SetupItem> items;
  std::ranges::copy_if(SetupItems(), std::back_inserter(items),
                       [&](const SetupItem& item) { return item.page == page; });
  return items;
}

std::vector<SetupItem> FindSettings(std::string_view words) {
  const std::string wanted = LowerCase(words);
  std::vector<SetupItem> found;
  if (wanted.find_first_not_of(' ') == std::string::npos) return found;
  for (const SetupItem& item : SetupItems()) {
    const std::string text = SearchedText(item);
    bool all = true;
    for (size_t end = 0, start = wanted.find_first_not_of(' '); start != std::string::npos;
         start = wanted.find_first_not_of(' ', end)) {
      end = std::min(wanted.find(' ', start), wanted.size());
      all = all && text.find(wanted.substr(start, end - start)) != std::string::npos;
    }
    if (all) found.push_back(item);
  }
  return found;
}

bool IsFunctionMask(KeyNumber key) { return key == FileHistoryFunctions; }

}  // namespace fotomill::desktop
