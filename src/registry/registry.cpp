#include "registry/registry.h"

#include <algorithm>
#include <array>
#include <iterator>

#include "core/text.h"
#include "formats/bmp/bmp.h"
#include "formats/fits/fits.h"
#include "formats/gif/gif.h"
#include "formats/hdphoto/hdp.h"
#include "formats/icon/ico.h"
#include "formats/jpeg/jpeg.h"
#include "formats/macpaint/mac.h"
#include "formats/pcx/pcx.h"
#include "formats/png/png.h"
#include "formats/targa/tga.h"
#include "formats/tiff/tiff.h"
#include "formats/webp/webp.h"
#include "formats/xbm/xbm.h"
#include "platform/paths.h"
#include "settings/settings.h"

namespace fotomill {

namespace {

// Operations of rows whose codec this build does not have.
Status NoDetails(PictureRecord&) { return Status::UnsupportedFunction; }
Status NoInfo(PictureRecord&, const char*, uint32_t) { return Status::UnsupportedFunction; }
Status NoRead(PictureRecord&, const char*) { return Status::UnsupportedFunction; }
Status NoWrite(PictureRecord&, const WriteOptions&) { return Status::UnsupportedFunction; }

// Formats that nobody writes: their makers never said how, or there is no picture in them to begin with.
Status NeverWritten(PictureRecord&, const WriteOptions&) { return Status::UnsupportedFunction; }

// The fractal format: its coder was never published and is gone.
Status FifInfo(PictureRecord&, const char*, uint32_t) { return Status::UnsupportedFormat; }
Status FifRead(PictureRecord&, const char*) { return Status::UnsupportedFormat; }
Status FifWrite(PictureRecord&, const WriteOptions&) { return Status::UnsupportedFormat; }

// The archive rows' hooks: nothing has to be loaded for ZIP; RAR waits for its library.
int32_t Ready() { return 1; }
int32_t NoStartup() { return 0; }

struct BuiltInRow {
  std::string_view extension;
  std::string_view description;
  int32_t enabled;
  uint32_t maxBits;
  uint32_t flags;
  DetailsOperation details;
  InfoOperation info;
  ReadOperation read;
  WriteOperation write;
  AnimateOperation animate = nullptr;
  LifeOperation startup = nullptr;
  LifeOperation shutdown = nullptr;
};

// The order is behaviour: the first row that matches a name wins, so .jpeg is read as JPE and .tiff as TIF.
// clang-format off
constexpr BuiltInRow kBuiltInRows[] = {
    {"AVI", "(AVI) Video for Windows", 1, 24, FMT_BITMAP | FMT_MULTI | FMT_ANIMATED | FMT_TIMED | FMT_FRAMES,
     nullptr, NoInfo, NoRead, NoWrite},
    {"BGA", "(BGA) OS/2 Warp", 1, 24, FMT_BITMAP | FMT_MULTI | FMT_PAGES | FMT_ALPHA,
     nullptr, NoInfo, NoRead, NoWrite},
    {"BMP", "(BMP) Windows bitmap", 1, 24, FMT_BITMAP | FMT_ALPHA,
     BmpDetails, BmpInfo, BmpRead, BmpWrite},
    {"CDR", "(CDR) Corel Draw Preview", 1, 24, FMT_BITMAP | FMT_MULTI | FMT_PAGES,
     NoDetails, NoInfo, NoRead, NeverWritten},
    {"CUT", "(CUT) Dr. Halo", 1, 8, FMT_BITMAP,
     nullptr, NoInfo, NoRead, NoWrite},
    {"DCX", "(DCX) DCX FAX", 1, 24, FMT_BITMAP | FMT_MULTI | FMT_PAGES,
     nullptr, NoInfo, NoRead, NoWrite},
    {"DIB", "(DIB) Windows", 1, 24, FMT_BITMAP | FMT_ALPHA,
     nullptr, BmpInfo, BmpRead, BmpWrite},
    {"EXE", "(EXE) Self-displaying image", 0, 24, FMT_BITMAP,
     nullptr, NoInfo, NoRead, NoWrite},
    {"FIT", "(FIT) Flexible Image Transport", 1, 24, FMT_BITMAP,
     FitsDetails, FitsInfo, FitsRead, FitsWrite},
    {"GIF", "(GIF) CompuServe", 1, 8, FMT_BITMAP | FMT_MULTI | FMT_ANIMATED | FMT_PAGES | FMT_TIMED | FMT_FRAMES | FMT_LAYERED | FMT_TRANSPARENT,
     GifDetails, GifInfo, GifRead, GifWrite, GifAnimate},
    {"HDP", "(HDP) HD Photo", 1, 24, FMT_BITMAP | FMT_MULTI | FMT_PAGES | FMT_FRAMES | FMT_LAYERED,
     HdpDetails, HdpInfo, HdpRead, HdpWrite},
    {"HRZ", "(HRZ) SSTV", 1, 24, FMT_BITMAP,
     nullptr, NoInfo, NoRead, NoWrite},
    {"ICO", "(ICO) Windows icon", 1, 24, FMT_BITMAP | FMT_MULTI | FMT_PAGES | FMT_CONTAINER | FMT_LAYERED | FMT_TRANSPARENT | FMT_ALPHA,
     nullptr, IcoInfo, IcoRead, IcoWrite},
    {"IFF", "(IFF) Amiga", 1, 24, FMT_BITMAP,
     NoDetails, NoInfo, NoRead, NoWrite},
    {"IMG", "(IMG) GEM/Ventura", 1, 24, FMT_BITMAP,
     nullptr, NoInfo, NoRead, NoWrite},
    {"JPG", "(JPG) Jpeg", 1, 24, FMT_BITMAP,
     JpegDetails, JpegInfo, JpegRead, JpegWrite},
    {"LBM", "(LBM) Amiga", 1, 8, FMT_BITMAP,
     NoDetails, NoInfo, NoRead, NoWrite},
    {"MAC", "(MAC) MacPaint", 1, 1, FMT_BITMAP,
     nullptr, MacInfo, MacRead, MacWrite},
    {"MOV", "(MOV) QuickTime movies", 1, 24, FMT_BITMAP | FMT_ANIMATED | FMT_TIMED | FMT_FRAMES,
     NoDetails, NoInfo, NoRead, NoWrite},
    {"MSP", "(MSP) Microsoft Paint", 1, 1, FMT_BITMAP,
     nullptr, NoInfo, NoRead, NoWrite},
    {"PCD", "(PCD) Kodak Photo-CD", 1, 24, FMT_BITMAP | FMT_MEDIA,
     NoDetails, NoInfo, NoRead, NeverWritten},
    {"PCX", "(PCX) PC Paintbrush", 1, 24, FMT_BITMAP,
     nullptr, PcxInfo, PcxRead, PcxWrite},
    {"PDD", "(PDD) Adobe Photoshop 2.5", 1, 24, FMT_BITMAP,
     nullptr, NoInfo, NoRead, NoWrite},
    {"PIC", "(PIC) GLPaint/Pegasus", 1, 24, FMT_BITMAP,
     nullptr, NoInfo, NoRead, NoWrite},
    {"PNG", "(PNG) Portable Network Graphics", 1, 24, FMT_BITMAP | FMT_MULTI | FMT_ANIMATED | FMT_PAGES | FMT_FRAMES | FMT_PNG | FMT_LAYERED | FMT_TRANSPARENT | FMT_SAVE_ANYWAY | FMT_ALPHA,
     PngDetails, PngInfo, PngRead, PngWrite},
    {"PSD", "(PSD) Adobe Photoshop 2.5", 1, 24, FMT_BITMAP,
     nullptr, NoInfo, NoRead, NoWrite},
    {"RAS", "(RAS) Sun Raster", 1, 24, FMT_BITMAP,
     nullptr, NoInfo, NoRead, NoWrite},
    {"RLE", "(RLE) Windows", 1, 8, FMT_BITMAP,
     nullptr, NoInfo, NoRead, NoWrite},
    {"SCR", "(SCR) Windows Screen Saver", 1, 24, FMT_BITMAP,
     nullptr, NoInfo, NoRead, NoWrite},
    {"SGI", "(SGI) Silicon Graphics", 1, 24, FMT_BITMAP | FMT_ALPHA,
     nullptr, NoInfo, NoRead, NoWrite},
    {"SWF", "(SWF) Flash", 1, 24, FMT_BITMAP | FMT_MULTI | FMT_PAGES | FMT_TIMED | FMT_FRAMES | FMT_LAYERED | FMT_TRANSPARENT | FMT_FLASH,
     NoDetails, NoInfo, NoRead, NoWrite},
    {"TGA", "(TGA) Targa", 1, 24, FMT_BITMAP | FMT_ALPHA,
     nullptr, TgaInfo, TgaRead, TgaWrite},
    {"TIF", "(TIF) TIFF", 1, 24, FMT_BITMAP | FMT_MULTI | FMT_PAGES | FMT_LAYERED | FMT_ALPHA,
     TiffDetails, TiffInfo, TiffRead, TiffWrite},
    {"TXT", "(TXT) Text files", 1, 24, FMT_BITMAP,
     nullptr, NoInfo, NoRead, NoWrite},
    {"WAV", "(WAV) Windows WAV", 1, 24, FMT_BITMAP | FMT_SOUND | FMT_MEDIA,
     nullptr, NoInfo, NoRead, NeverWritten},
    {"WBMP", "(WBMP) WAP bitmap", 1, 1, FMT_BITMAP,
     nullptr, NoInfo, NoRead, NoWrite},
    {"WEBP", "(WEBP) Google WebP", 1, 24, FMT_BITMAP | FMT_MULTI | FMT_ANIMATED | FMT_TIMED | FMT_FRAMES | FMT_LAYERED | FMT_TRANSPARENT | FMT_ALPHA,
     nullptr, WebpInfo, WebpRead, WebpWrite, WebpAnimate},
    {"WPG", "(WPG) WordPerfect Graphics", 1, 8, FMT_BITMAP,
     nullptr, NoInfo, NoRead, NoWrite},
    {"XBM", "(XBM) XWindows bitmap", 1, 1, FMT_BITMAP,
     nullptr, XbmInfo, XbmRead, XbmWrite},
    {"Clpbrd", "Windows Clipboard", 1, 24, FMT_BITMAP | FMT_RENDERED | FMT_CLIPBOARD,
     nullptr, NoInfo, NoRead, NoWrite},
    {"Wllppr", "(BMP) Windows wallpaper", 1, 24, FMT_BITMAP | FMT_WALLPAPER | FMT_NO_OPEN,
     nullptr, NoInfo, NoRead, NoWrite},
    {"ANI", "(ANI) Windows animated cursor", 1, 24, FMT_BITMAP | FMT_MULTI | FMT_ANIMATED | FMT_TIMED | FMT_FRAMES | FMT_LAYERED | FMT_SECONDARY | FMT_TRANSPARENT,
     nullptr, NoInfo, NoRead, NoWrite},
    {"CAL", "(CAL) CALS", 1, 1, FMT_BITMAP | FMT_SECONDARY,
     nullptr, NoInfo, NoRead, NoWrite},
    {"CALS", "(CAL) CALS", 1, 1, FMT_BITMAP | FMT_SECONDARY,
     nullptr, NoInfo, NoRead, NoWrite},
    {"CAM", "(CAM) Casio Digital Camera", 1, 24, FMT_BITMAP | FMT_SECONDARY,
     nullptr, NoInfo, NoRead, NeverWritten},
    {"EMF", "(EMF) Enhanced Metafile", 1, 24, FMT_RENDERED | FMT_SECONDARY,
     nullptr, NoInfo, NoRead, NoWrite},
    {"EPS", "(EPS) EPS Preview", 0, 24, FMT_SECONDARY,
     nullptr, NoInfo, NoRead, NoWrite},
    {"FIF", "(FIF) Fractal Image", 1, 24, FMT_BITMAP | FMT_SECONDARY,
     nullptr, FifInfo, FifRead, FifWrite},
    {"FLI", "(FLI) FLIC animation", 1, 8, FMT_BITMAP | FMT_MULTI | FMT_ANIMATED | FMT_TIMED | FMT_FRAMES | FMT_SECONDARY,
     nullptr, NoInfo, NoRead, NoWrite},
    {"FLC", "(FLC) FLIC animation", 1, 8, FMT_BITMAP | FMT_MULTI | FMT_ANIMATED | FMT_TIMED | FMT_FRAMES | FMT_SECONDARY,
     nullptr, NoInfo, NoRead, NoWrite},
    {"FPX", "(FPX) FlashPix", 1, 24, FMT_BITMAP | FMT_SECONDARY,
     nullptr, NoInfo, NoRead, NeverWritten},
    {"FTS", "(FTS) Flex. Image Transport", 1, 24, FMT_BITMAP | FMT_SECONDARY,
     FitsDetails, FitsInfo, FitsRead, FitsWrite},
    {"CUR", "(CUR) Windows cursor", 1, 24, FMT_BITMAP | FMT_SECONDARY | FMT_ALPHA,
     nullptr, IcoInfo, IcoRead, IcoWrite},
    {"HAM", "(HAM) Amiga", 1, 24, FMT_BITMAP | FMT_SECONDARY,
     NoDetails, NoInfo, NoRead, NoWrite},
    {"JFI", "(JFI) Jpeg", 0, 24, FMT_BITMAP | FMT_SECONDARY,
     nullptr, JpegInfo, JpegRead, JpegWrite},
    {"JFIF", "(JFIF) Jpeg", 1, 24, FMT_BITMAP | FMT_SECONDARY,
     nullptr, JpegInfo, JpegRead, JpegWrite},
    {"JPE", "(JPE) Jpeg", 0, 24, FMT_BITMAP | FMT_SECONDARY,
     nullptr, JpegInfo, JpegRead, JpegWrite},
    {"JPEG", "(JPEG) Jpeg", 1, 24, FMT_BITMAP | FMT_SECONDARY,
     nullptr, JpegInfo, JpegRead, JpegWrite},
    {"KDC", "(KDC) Kodak Digital Camera", 1, 24, FMT_BITMAP | FMT_SECONDARY,
     nullptr, NoInfo, NoRead, NeverWritten},
    {"PCT", "(PCT) Macintosh PICT", 1, 24, FMT_BITMAP | FMT_SECONDARY,
     nullptr, NoInfo, NoRead, NoWrite},
    {"KQP", "(KQP) Konica Quality Photos", 1, 24, FMT_BITMAP | FMT_SECONDARY,
     nullptr, NoInfo, NoRead, NeverWritten},
    {"PSP", "(PSP) PSP", 1, 24, FMT_BITMAP | FMT_MULTI | FMT_PAGES | FMT_SECONDARY,
     nullptr, NoInfo, NoRead, NoWrite},
    {"MID", "(MID) MIDI music", 1, 24, FMT_BITMAP | FMT_SECONDARY | FMT_MEDIA | FMT_MIDI,
     nullptr, NoInfo, NoRead, NeverWritten},
    {"MP3", "(MP3) MP3 compressed music", 1, 24, FMT_BITMAP | FMT_TIMED | FMT_SECONDARY | FMT_MEDIA,
     nullptr, NoInfo, NoRead, NeverWritten},
    {"MP4", "(MP4) MPEG-4 video", 1, 24, FMT_BITMAP | FMT_ANIMATED | FMT_TIMED | FMT_SECONDARY | FMT_MEDIA,
     nullptr, NoInfo, NoRead, NoWrite},
    {"MPEG", "(MPEG) MPEG-4 video", 1, 24, FMT_BITMAP | FMT_ANIMATED | FMT_TIMED | FMT_SECONDARY | FMT_MEDIA,
     nullptr, NoInfo, NoRead, NoWrite},
    {"MPG", "(MPG) MPEG-4 video", 1, 24, FMT_BITMAP | FMT_ANIMATED | FMT_TIMED | FMT_SECONDARY | FMT_MEDIA,
     nullptr, NoInfo, NoRead, NoWrite},
    {"M4V", "(M4V) MPEG-4 video", 1, 24, FMT_BITMAP | FMT_ANIMATED | FMT_TIMED | FMT_SECONDARY | FMT_MEDIA,
     nullptr, NoInfo, NoRead, NoWrite},
    {"RGB", "(RGB) Silicon Graphics", 1, 24, FMT_BITMAP | FMT_SECONDARY | FMT_ALPHA,
     nullptr, NoInfo, NoRead, NoWrite},
    {"TTF", "(TTF) TrueType Font", 1, 24, FMT_BITMAP | FMT_SECONDARY,
     NoDetails, NoInfo, NoRead, NeverWritten},
    {"OTF", "(OTF) OpenType Font", 1, 24, FMT_BITMAP | FMT_SECONDARY,
     NoDetails, NoInfo, NoRead, NeverWritten},
    {"UUE", "(UUE) UUEncoded graphics", 1, 24, FMT_BITMAP | FMT_SECONDARY,
     nullptr, NoInfo, NoRead, NoWrite},
    {"WDP", "(WDP) HD Photo", 1, 24, FMT_BITMAP | FMT_MULTI | FMT_PAGES | FMT_FRAMES | FMT_LAYERED | FMT_SECONDARY,
     nullptr, HdpInfo, HdpRead, HdpWrite},
    {"WMF", "(WMF) Windows Metafile", 1, 24, FMT_RENDERED | FMT_SECONDARY,
     nullptr, NoInfo, NoRead, NoWrite},
    {"WMV", "(WMV) WMV video", 1, 24, FMT_BITMAP | FMT_ANIMATED | FMT_TIMED | FMT_SECONDARY | FMT_MEDIA,
     nullptr, NoInfo, NoRead, NoWrite},
    {"RAR", "(RAR) RAR archive", 1, 24, FMT_BITMAP | FMT_MULTI | FMT_PAGES | FMT_CONTAINER | FMT_LAYERED | FMT_SECONDARY | FMT_ARCHIVE,
     nullptr, NoInfo, NoRead, NeverWritten, nullptr, NoStartup, NoStartup},
    {"ZIP", "(ZIP) ZIP archive", 1, 24, FMT_BITMAP | FMT_MULTI | FMT_PAGES | FMT_CONTAINER | FMT_LAYERED | FMT_SECONDARY | FMT_ARCHIVE,
     nullptr, NoInfo, NoRead, NoWrite, nullptr, Ready, Ready},
    {"", "", 0, 0, FMT_SPARE,
     nullptr, nullptr, nullptr, nullptr},
};
// clang-format on
static_assert(std::size(kBuiltInRows) == formatCount);
static_assert(kBuiltInRows[kSpareRow].flags == FMT_SPARE && kBuiltInRows[kSpareRow].info == nullptr);

constexpr std::array<FormatEntry, formatCount> MakeRows() {
  std::array<FormatEntry, formatCount> rows;
  for (size_t i = 0; i < rows.size(); ++i) {
    const BuiltInRow& facts = kBuiltInRows[i];
    rows[i] = {.details = facts.details,
               .info = facts.info,
               .read = facts.read,
               .write = facts.write,
               .animate = facts.animate,
               .startup = facts.startup,
               .shutdown = facts.shutdown,
               .maxBits = facts.maxBits,
               .extension = facts.extension,
               .description = facts.description,
               .enabled = facts.enabled,
               .flags = facts.flags};
  }
  return rows;
}

constinit std::array<FormatEntry, formatCount> formatRows = MakeRows();
constinit thread_local FormatEntry spareRow = MakeRows()[kSpareRow];
const PluginSource* pluginSource = nullptr;

// Rows whose library is loaded when it is needed, and may not be there.
bool LacksLibrary(const FormatEntry& row) { return row.read == HdpRead && !HdpWorksHere(); }

// A row matches an extension that equals its own, or that shares its first three characters; a shorter one must match
// to its end.
bool RowMatches(std::string_view rowExtension, std::string_view extension) {
  return EqualIgnoringCase(extension, rowExtension) || EqualIgnoringCase(extension.substr(0, 3), rowExtension.substr(0, 3));
}

}  // namespace

FormatEntry& FormatRow(int32_t index) { return index == kSpareRow ? spareRow : formatRows[static_cast<size_t>(index)]; }

int32_t EnabledByDefault(int32_t index) { return index == kSpareRow ? 0 : kBuiltInRows[index].enabled; }

int32_t FindFormatByName(std::string_view fileName, int32_t parameter) {
  const std::string_view extension = platform::ExtensionOf(fileName);
  for (int32_t i = 0; i < formatCount && !extension.empty(); ++i) {
    const FormatEntry& row = FormatRow(i);
    if ((row.flags & (FMT_SPARE | FMT_CLIPBOARD)) != 0) continue;
    if (settings.AllowPluginFormatOverride != 0 && row.enabled == 0) continue;
    if (RowMatches(row.extension, extension)) return i;
  }
  return FindPluginFormat(fileName, parameter);
}

void InstallPluginSource(const PluginSource* source) { pluginSource = source; }

int32_t FindPluginFormat(std::string_view fileName, int32_t parameter) {
  return pluginSource == nullptr ? kNoFormat : pluginSource->bind(fileName, parameter);
}

std::vector<PluginFormatFacts> PluginFormats() {
  return pluginSource == nullptr ? std::vector<PluginFormatFacts>{} : pluginSource->list();
}

std::string PluginDescription(const PluginFormatFacts& format) {
  return "(" + format.extension + ") Plugin" + (format.textB.empty() ? "" : " " + format.textB);
}

bool CanRead(const FormatEntry& row) {
  if (LacksLibrary(row)) return false;
  if (row.info == nullptr || row.info == NoInfo || row.info == FifInfo) return false;
  return (row.flags & FMT_RENDERED) != 0 || (row.read != nullptr && row.read != NoRead);
}

bool CanWrite(const FormatEntry& row) {
  return !LacksLibrary(row) && row.write != nullptr && row.write != NoWrite && row.write != NeverWritten && row.write != FifWrite;
}

bool CanTellDetails(const FormatEntry& row) { return row.details != nullptr && row.details != NoDetails; }

bool CanStartUp(const FormatEntry& row) { return row.startup != nullptr && row.startup != NoStartup; }

std::string_view WhyNot(const FormatEntry& row) {
  if (row.info == FifInfo) return "The format was never published.";
  if ((row.flags & FMT_SPARE) != 0) return "No plug-in uses this row.";
  if (LacksLibrary(row)) return "The library libjxr is not installed.";
  if (!CanRead(row)) return "This build has no codec for the format.";
  if (row.write == NeverWritten) return "Files of this format can only be read.";
  if (!CanWrite(row)) return "This build cannot write the format.";
  return {};
}

bool KeepsMetadata(const FormatEntry& row) {
  constexpr WriteOperation kWriters[] = {HdpWrite, JpegWrite, PngWrite, TiffWrite, WebpWrite};
  return std::find(std::begin(kWriters), std::end(kWriters), row.write) != std::end(kWriters);
}

// None of the writers that this build has knows a protected form of its format.
bool TakesPassword(const FormatEntry&) { return false; }

void RunFormatStartup() {
  for (const FormatEntry& row : formatRows) {
    if (row.startup != nullptr) (void)row.startup();
  }
}

void RunFormatShutdown() {
  for (const FormatEntry& row : formatRows) {
    if (row.shutdown != nullptr) (void)row.shutdown();
  }
}

std::string DescribeFileType(std::string_view fileName) {
  const std::string extension = UpperCase(platform::ExtensionOf(fileName));
  for (const FormatEntry& row : formatRows) {
    if (row.enabled == 0 || (row.flags & (FMT_WALLPAPER | FMT_CLIPBOARD | FMT_SPARE)) != 0) continue;
    if (EqualIgnoringCase(row.extension, extension)) return std::string(row.description.view());
  }
  return "(" + extension + ") " + extension + " file";
}

std::vector<FilterPair> OpenFileFilter() {
  std::vector<FilterPair> pairs(1, {"All pictures", ""});
  for (const FormatEntry& row : formatRows) {
    if ((row.flags & (FMT_WALLPAPER | FMT_CLIPBOARD | FMT_NO_OPEN | FMT_SPARE)) != 0) continue;
    const std::string pattern = "*." + std::string(row.extension.view());
    pairs.push_back({std::string(row.description.view()), pattern});
    pairs[0].patterns += (pairs[0].patterns.empty() ? "" : ";") + pattern;
  }
  for (const PluginFormatFacts& format : PluginFormats()) {
    pairs.push_back({PluginDescription(format), "*." + format.extension});
    pairs[0].patterns += ";*." + format.extension;
  }
  return pairs;
}

std::vector<int32_t> DestinationRows() {
  constexpr uint32_t kExcluded = FMT_WALLPAPER | FMT_CLIPBOARD | FMT_SECONDARY | FMT_ANIMATED | FMT_SPARE;
  std::vector<int32_t> rows;
  for (int32_t i = 0; i < formatCount; ++i) {
    const uint32_t flags = FormatRow(i).flags;
    if ((flags & FMT_SAVE_ANYWAY) != 0 || (flags & kExcluded) == 0) rows.push_back(i);
  }
  return rows;
}

std::vector<std::string> DestinationExtensions() {
  std::vector<std::string> extensions;
  for (const int32_t index : DestinationRows()) extensions.push_back(LowerCase(FormatRow(index).extension.view()));
  for (const PluginFormatFacts& format : PluginFormats()) {
    if (format.canWrite) extensions.push_back(LowerCase(format.extension));
  }
  return extensions;
}

std::vector<int32_t> FormatListRows() {
  std::vector<int32_t> rows;
  for (int32_t i = 0; i < formatCount; ++i) {
    if ((FormatRow(i).flags & (FMT_CLIPBOARD | FMT_SPARE)) == 0) rows.push_back(i);
  }
  return rows;
}

std::vector<int32_t> ChoiceRows() {
  std::vector<int32_t> rows;
  for (int32_t i = 0; i < formatCount; ++i) {
    const FormatEntry& row = FormatRow(i);
    if (row.enabled == 1 && (row.flags & (FMT_CLIPBOARD | FMT_HIDDEN | FMT_SPARE)) == 0) rows.push_back(i);
  }
  return rows;
}

std::string FormatListLine(int32_t index) {
  const FormatEntry& row = FormatRow(index);
  return (row.enabled != 0 ? "\xc3\x97\t" : " \t") + std::string(row.description.view());
}

}  // namespace fotomill
