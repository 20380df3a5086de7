#include "registry/format_table.h"

#include <algorithm>
#include <iterator>

#include "formats/rows.h"
#include "texts/texts.h"

namespace fotomill {

namespace {

// Operations of rows without a codec in this build.
Status NoInfo(PictureRecord&, const ReadRequest&) { return Status::UnsupportedFunction; }
Status NoRead(PictureRecord&, const ReadRequest&) { return Status::UnsupportedFunction; }
Status NoWrite(PictureRecord&, const WriteOptions&) { return Status::UnsupportedFunction; }

// The fractal format: its codec was never published.
Status UnpublishedInfo(PictureRecord&, const ReadRequest&) { return Status::UnsupportedFormat; }
Status UnpublishedRead(PictureRecord&, const ReadRequest&) { return Status::UnsupportedFormat; }
Status UnpublishedWrite(PictureRecord&, const WriteOptions&) { return Status::UnsupportedFormat; }

// A position in the registry. A codec family with a row of that extension fills it; otherwise the
// values here are used.
struct Place {
  std::string_view extension;
  std::string_view description = {};
  int32_t enabled = 0;
  uint32_t maxBits = 0;
  uint32_t flags = 0;
  bool unpublished = false;
};

// The order matters: the first row that matches a name wins, so .jpeg is read as JPE and
// .tiff as TIF.
// clang-format off
constexpr Place kPlaces[] = {
    {"AVI", "(AVI) Video for Windows", 1, 24, FMT_BITMAP | FMT_MULTI | FMT_ANIMATED | FMT_TIMED | FMT_FRAMES},
    {"BGA"},
    {"BMP"},
    {"CDR", "(CDR) Corel Draw Preview", 1, 24, FMT_BITMAP | FMT_MULTI | FMT_PAGES},
    {"CUT"},
    {"DCX"},
    {"DIB"},
    {"EXE", "(EXE) Self-displaying image", 0, 24, FMT_BITMAP},
    {"FIT"},
    {"GIF"},
    {"HDP"},
    {"HRZ"},
    {"ICO"},
    {"IFF"},
    {"IMG"},
    {"JPG"},
    {"LBM"},
    {"MAC"},
    {"MOV", "(MOV) QuickTime movies", 1, 24, FMT_BITMAP | FMT_ANIMATED | FMT_TIMED | FMT_FRAMES},
    {"MSP"},
    {"PCD"},
    {"PCX"},
    {"PDD"},
    {"PIC"},
    {"PNG"},
    {"PSD"},
    {"RAS"},
    {"RLE"},
    {"SCR", "(SCR) Windows Screen Saver", 1, 24, FMT_BITMAP},
    {"SGI"},
    {"SWF", "(SWF) Flash", 1, 24, FMT_BITMAP | FMT_MULTI | FMT_PAGES | FMT_TIMED | FMT_FRAMES | FMT_LAYERED | FMT_TRANSPARENT | FMT_FLASH},
    {"TGA"},
    {"TIF"},
    {"TXT"},
    {"WAV", "(WAV) Windows WAV", 1, 24, FMT_BITMAP | FMT_SOUND | FMT_MEDIA},
    {"WBMP"},
    {"WEBP"},
    {"WPG"},
    {"XBM"},
    {"Clpbrd", "Windows Clipboard", 1, 24, FMT_BITMAP | FMT_RENDERED | FMT_CLIPBOARD},
    {"Wllppr", "(BMP) Windows wallpaper", 1, 24, FMT_BITMAP | FMT_WALLPAPER | FMT_NO_OPEN},
    {"ANI"},
    {"CAL"},
    {"CALS"},
    {"CAM"},
    {"EMF", "(EMF) Enhanced Metafile", 1, 24, FMT_RENDERED | FMT_SECONDARY},
    {"EPS", "(EPS) EPS Preview", 0, 24, FMT_SECONDARY},
    {"FIF", "(FIF) Fractal Image", 1, 24, FMT_BITMAP | FMT_SECONDARY, true},
    {"FLI", "(FLI) FLIC animation", 1, 8, FMT_BITMAP | FMT_MULTI | FMT_ANIMATED | FMT_TIMED | FMT_FRAMES | FMT_SECONDARY},
    {"FLC", "(FLC) FLIC animation", 1, 8, FMT_BITMAP | FMT_MULTI | FMT_ANIMATED | FMT_TIMED | FMT_FRAMES | FMT_SECONDARY},
    {"FPX"},
    {"FTS"},
    {"CUR"},
    {"HAM"},
    {"JFI"},
    {"JFIF"},
    {"JPE"},
    {"JPEG"},
    {"KDC"},
    {"PCT"},
    {"KQP"},
    {"PSP"},
    {"MID", "(MID) MIDI music", 1, 24, FMT_BITMAP | FMT_SECONDARY | FMT_MEDIA | FMT_MIDI},
    {"MP3", "(MP3) MP3 compressed music", 1, 24, FMT_BITMAP | FMT_TIMED | FMT_SECONDARY | FMT_MEDIA},
    {"MP4", "(MP4) MPEG-4 video", 1, 24, FMT_BITMAP | FMT_ANIMATED | FMT_TIMED | FMT_SECONDARY | FMT_MEDIA},
    {"MPEG", "(MPEG) MPEG-4 video", 1, 24, FMT_BITMAP | FMT_ANIMATED | FMT_TIMED | FMT_SECONDARY | FMT_MEDIA},
    {"MPG", "(MPG) MPEG-4 video", 1, 24, FMT_BITMAP | FMT_ANIMATED | FMT_TIMED | FMT_SECONDARY | FMT_MEDIA},
    {"M4V", "(M4V) MPEG-4 video", 1, 24, FMT_BITMAP | FMT_ANIMATED | FMT_TIMED | FMT_SECONDARY | FMT_MEDIA},
    {"RGB"},
    {"TTF", "(TTF) TrueType Font", 1, 24, FMT_BITMAP | FMT_SECONDARY},
    {"OTF", "(OTF) OpenType Font", 1, 24, FMT_BITMAP | FMT_SECONDARY},
    {"UUE"},
    {"WDP"},
    {"WMF", "(WMF) Windows Metafile", 1, 24, FMT_RENDERED | FMT_SECONDARY},
    {"WMV", "(WMV) WMV video", 1, 24, FMT_BITMAP | FMT_ANIMATED | FMT_TIMED | FMT_SECONDARY | FMT_MEDIA},
    {"RAR"},
    {"ZIP"},
};
// clang-format on
static_assert(std::size(kPlaces) == kSpareRow);

FormatEntry RowWithoutCodec(const Place& place) {
  FormatEntry row;
  row.info = place.unpublished ? UnpublishedInfo : NoInfo;
  row.read = place.unpublished ? UnpublishedRead : NoRead;
  row.write = place.unpublished ? UnpublishedWrite : NoWrite;
  row.maxBits = place.maxBits;
  row.extension = place.extension;
  row.description = place.description;
  row.enabled = place.enabled;
  row.flags = place.flags;
  row.whyNot = place.unpublished ? TrLater("The format was never published.")
                                 : TrLater("This build has no codec for the format.");
  return row;
}

}  // namespace

std::vector<std::span<const FormatEntry>> FormatFamilies() {
  return {
#define FAMILY(name) name##Rows(),
#include "formats/families.def"
#undef FAMILY
  };
}

FormatTable MakeFormatTable() {
  FormatTable table;
  std::ranges::transform(kPlaces, table.begin(), RowWithoutCodec);
  table[kSpareRow] = SpareRow();
  for (const std::span<const FormatEntry> family : FormatFamilies()) {
    for (const FormatEntry& row : family) {
      const auto place = std::ranges::find(kPlaces, row.extension.view(), &Place::extension);
      if (place == std::end(kPlaces)) continue;
      FormatEntry& entry = table[static_cast<size_t>(place - kPlaces)];
      entry = row;
      if (entry.write == nullptr) entry.write = NoWrite;  // read-only formats
    }
  }
  return table;
}

}  // namespace fotomill
