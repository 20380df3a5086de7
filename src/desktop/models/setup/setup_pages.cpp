#include "desktop/models/setup/setup_pages.h"

#include <algorithm>
#include <iterator>
#include <string>

#include "core/text.h"
#include "desktop/models/setup/setup_help.h"
#include "registry/registry.h"

namespace fotomill::desktop {

namespace {

using enum SetupPage;
using enum KeyNumber;

// clang-format off
constexpr SetupItem kItems[] = {
    {Browsing,   "Start",              RememberOpenWindows,            "Open the tabs of the last time"},
    {Browsing,   "New browsers",       DefaultViewMode,                "Show files as"},
    {Browsing,   "New browsers",       DefaultSortMode,                "Sort by"},
    {Browsing,   "New browsers",       DefaultThumbnailMode,           "Thumbnails come from"},
    {Browsing,   "Folders",            UseFolderOverrides,             "Folders may choose their own view"},
    {Browsing,   "Folders",            WatchFolders,                   "Follow changes in folders as they happen"},
    {Browsing,   "List of files",      ClearAllOnBlankClick,           "A click on empty space clears the selection"},
    {Browsing,   "List of files",      FileTipShow,                    "Show a tip with facts about the file under the pointer"},
    {Browsing,   "List of files",      DetailSizeMode,                 "File sizes in"},
    {Browsing,   "Files",              DropOptions,                    "When files are dropped on a folder"},
    {Browsing,   "Files",              UndoLevels,                     "Changes that can be taken back"},
    {Browsing,   "Files",              NewFolderName,                  "Name of new folders"},
    {Browsing,   "Files",              ClipboardPictureName,           "Name of pictures from the clipboard"},
    {Browsing,   "Lists of what was used last", CopyHistoryMax,        "Folders copied or moved to"},
    {Browsing,   "Lists of what was used last", DestHistoryMax,        "Destination folders"},
    {Browsing,   "Lists of what was used last", EditListMaximum,       "Base names of sequential renaming"},
    {Thumbnails, "Making",             BrowserThumbnailPrecacheEnable, "Make thumbnails of files out of sight as well"},
    {Thumbnails, "Making",             ThumbnailQuickResize,           "Scale quickly instead of well"},
    {Thumbnails, "Making",             ThumbnailZoomFilter,            "Filter for scaling"},
    {Thumbnails, "Making",             ThumbnailMatte,                 "Color around and behind the picture"},
    {Thumbnails, "Making",             FastZoomedThumbnails,           "Draw large thumbnails quickly instead of well"},
    {Thumbnails, "Making",             AutoCreateThumbnail,            "Store thumbnails that were made in the database modes"},
    {Thumbnails, "Making",             UpdateThumbnailsFlag,           "Offer to make thumbnails where they are missing"},
    {Thumbnails, "Storing",            AlwaysUseTHN,                   "Use thumbnail files in the database modes as well"},
    {Thumbnails, "Storing",            UseWindowsThumbnailCache,       "Use the system's thumbnails for large ones"},
    {Thumbnails, "Storing",            WriteHiddenThumbnails,          "Hide thumbnail files and databases"},
    {Thumbnails, "Storing",            UseThumbnailCompacting,         "Delete thumbnail files whose pictures are gone"},
    {Thumbnails, "Storing",            ThumbnailCompactInterval,       "Days between two such clean-ups"},
    {Viewing,    "Size",               DefaultViewZoom,                "Open pictures at"},
    {Viewing,    "Size",               OptimumZoomNoUpsize,            "Fitting never enlarges"},
    {Viewing,    "Size",               ResizeFilter,                   "Filter for scaling"},
    {Viewing,    "Size",               ViewModeKeepZoom,               "Keep zoom and place between pictures"},
    {Viewing,    "Picture",            ExifAdjustOrientation,          "Turn pictures upright as the camera says"},
    {Viewing,    "Picture",            ViewModeColorProfiles,          "Follow the color profiles of pictures"},
    {Viewing,    "Picture",            ViewModeCheckerboard,           "Show transparency as a checkerboard"},
    {Viewing,    "Picture",            UseAlphaChannels,               "Read transparency of bitmaps (BMP)"},
    {Viewing,    "Picture",            RecognizeAPNG,                  "Recognize animated PNG files"},
    {Viewing,    "Animations",         AnimationViewModeProgressBar,   "Show how far an animation is"},
    {Viewing,    "Animations",         AnimationViewModeToolbar,       "Show buttons below an animation"},
    {Viewing,    "Window",             ViewModeBackground,             "Color behind the picture"},
    {Viewing,    "Window",             MaximizeViewWindow,             "Open view windows as large as the screen"},
    {Viewing,    "Window",             RightClickMenuInView,           "The right mouse button opens a menu"},
    {Viewing,    "Window",             PromptDeleteFromView,           "Ask before a picture goes to the trash"},
    {Batches,    "Before",             WarnDestinationWrite,           "Ask before files are written in another format"},
    {Batches,    "Before",             AllowDestinationOverrides,      "Shift at the destination step opens the format's options"},
    {Batches,    "Progress",           CloseProgressWhenDone,          "Close the progress box when all went well"},
    {Batches,    "Progress",           ProgressOptimizeWindow,         "Make the progress box as tall as the window"},
    {Batches,    "Progress",           ProgressThumbnails,             "Show thumbnails in the progress box"},
    {Batches,    "Progress",           ProgressShowMissingThumbnails,  "Keep the place of thumbnails that are missing"},
    {Batches,    "Progress",           ProgressRaiseAppWindow,         "Bring the program to the front at the end"},
    {Batches,    "Files that are there", PromptBeforeOverwrite,        "Ask before a file is replaced"},
    {Batches,    "Files that are there", OverwriteKeepBoth,            "Keep both files"},
    {Batches,    "Files that are there", OverwritePromptPreviews,      "Show previews when asking"},
    {Batches,    "Files that are there", OverwritePromptRecycle,       "Move replaced files to the trash"},
    {Saving,     "New files",          DefaultFileExtension,           "Format that is offered first"},
    {Saving,     "New files",          PreserveEXIF,                   "Carry over EXIF, XMP and color profiles"},
    {Saving,     "New files",          WriteFileComments,              "Write comments into files of plug-in formats"},
    {Saving,     "New files",          PasswordProtect,                "Protect files with a password where the format can"},
    {Saving,     "New files",          TiffResolution,                 "Resolution of pictures that have none (dots per inch)"},
    {Saving,     "New files",          AlphaBackground,                "Color behind transparency that a format cannot hold"},
    {Names,      "Where",              DestForceSourceDir,             "Write next to the source file"},
    {Names,      "Names",              PromptForDestName,              "Ask for the name of every file"},
    {Names,      "Names",              ExtensionCaseStyle,             "Letters of extensions"},
    {Names,      "Sequential renaming", SequentialRenameBaseName,      "Base name"},
    {Names,      "Sequential renaming", SequentialRenameBaseNumber,    "First number"},
    {Names,      "Sequential renaming", SequentialRenameIncrement,     "Step from number to number"},
    {Names,      "Sequential renaming", SequentialRenamePrefix,        "Numbers come first"},
    {Names,      "Sequential renaming", SequentialRenameHyphen,        "A separator between name and number"},
    {Names,      "Sequential renaming", SequentialRenameSep,           "That separator"},
    {Names,      "Sequential renaming", SequentialRenameRandom,        "In random order"},
    {Names,      "Sequential renaming", SequentialRenameSkipCollide,   "Go on with the next number where a name is taken"},
    {Names,      "Sequential renaming", SequentialRenameMaxAttempts,   "Numbers tried at most"},
    {Names,      "Sequential renaming", SequentialRenameUpdate,        "The next renaming goes on counting"},
    {Names,      "Contact sheets",     PrefixCatalog,                  "Names begin with"},
    {Names,      "Contact sheets",     CatalogFontName,                "Font of the captions"},
    {Colors,     "Fewer colors",       FXColorDither,                  "Dithering"},
    {Colors,     "Fewer colors",       FXBidirectional,                "Turn at the end of every row"},
    {Colors,     "Fewer colors",       DitherBrightness,               "Brightness before, -100 to 100"},
    {Colors,     "Fewer colors",       DitherContrast,                 "Contrast before, -100 to 100"},
    {Colors,     "Without colors",     FXMonomode,                     "Become"},
    {Colors,     "Without colors",     FXMonoDither,                   "Dithering"},
    {Colors,     "Without colors",     FXThreshold,                    "Threshold of white, 1 to 255; 0 finds the best"},
    {Colors,     "Without colors",     FXGrayLevel,                    "Shades of gray, 2 to 256; 0 for all"},
    {Metadata,   "EXIF",               ExifShowTypes,                  "Show the type of every value"},
    {Metadata,   "Places",             ExifDefaultLocation,            "Location that is offered first"},
    {Metadata,   "Places",             ExifDistinceUnits,              "Distances in"},
    {Metadata,   "Get info",           InfoUnits,                      "Print size in"},
    {Metadata,   "Get info",           InfoResolution,                 "Print size at (dots per inch) where the file does not say"},
    {History,    "Remember",           FileHistoryEnable,              "Remember which files were used"},
    {History,    "Remember",           FileHistoryFunctions,           "After these functions"},
    {History,    "Remember",           FileHistoryWindowType,          "Limit by"},
    {History,    "Remember",           FileHistoryWindowCount,         "Number of items"},
    {History,    "Remember",           FileHistoryWindowDays,          "Days to remember"},
    {History,    "List",               FileHistoryThumbnailMode,       "Thumbnails"},
    {History,    "List",               FileHistoryDateMode,            "Dates"},
    {History,    "List",               FileHistoryListRuleEnable,      "Rule lines between rows"},
    {History,    "List",               FileHistoryRemovePrompt,        "Ask before entries are removed"},
    {History,    "File",               FileHistoryDatabase,            "Name of the history file"},
    {Formats,    "Plug-ins",           AllowPluginFormatOverride,      "Plug-ins take over formats that are switched off"},
};
// clang-format on

constexpr const char* kTitles[] = {"Browsing",   "Thumbnails", "Viewing",       "Batches",      "Saving",
                                   "File names", "Colors",     "EXIF and info", "File history", "Formats"};
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

// The rows above, and at the end of the page Saving those that the formats have themselves.
std::vector<SetupItem> WithSettingsOfFormats() {
  std::vector<SetupItem> items(std::begin(kItems), std::end(kItems));
  auto place = std::ranges::find_if(items, [](const SetupItem& item) { return item.page > Saving; });
  for (const FormatSettings* const codec : SettingsOfFormats()) {
    for (const FormatSetting& setting : codec->keys) {
      const KeyRow* const row = FindKey(setting.key);
      if (row == nullptr || *setting.label == '\0') continue;
      place = items.insert(place, {Saving, codec->group, static_cast<KeyNumber>(NumberOfKey(*row)), setting.label}) + 1;
    }
  }
  return items;
}

std::string SearchedText(const SetupItem& item) {
  const char* const name = KeyOf(item.key).name;
  std::string text = std::string(TitleOf(item.page)) + " " + item.group + " " + item.label + " " + name;
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
  std::ranges::copy_if(SetupItems(), std::back_inserter(items), [&](const SetupItem& item) { return item.page == page; });
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
