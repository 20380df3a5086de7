#include "formats/rows.h"

#include <tiffio.h>

#include "containers/bare_file.h"
#include "formats/tiff/tiff.h"
#include "texts/texts.h"

namespace fotomill {

namespace {

using namespace std::string_view_literals;

constexpr Signature kSignatures[] = {
    {0, "II\x2a\0"sv, "TIFF"},
    {0, "MM\0\x2a"sv, "TIFF"},
    {0, "II\x2b\0"sv, "TIFF"},
    {0, "MM\0\x2b"sv, "TIFF"},
};

constexpr FormatSetting kKeys[] = {
    {"TiffOptions", TrLater("Compression")}, {"TiffResolution"}, {"JpegCompression"}};
constexpr FormatSettings kSettings = {"TIF", "OverrideTifBox", TrLater("TIFF"), kKeys};

// The version is in "LIBTIFF, Version 4.5.0" and a copyright line.
std::string TiffVersion() {
  const std::string text = TIFFGetVersion();
  const size_t start = text.find_first_of("0123456789");
  return start == std::string::npos ? text : text.substr(start, text.find('\n', start) - start);
}
constexpr FormatLibrary kLibraries[] = {{"libtiff", TiffVersion, TrLater("TIFF")}};

constexpr FormatEntry kRows[] = {{
    .details = TiffDetails,
    .info = TiffInfo,
    .read = TiffRead,
    .write = TiffWrite,
    .maxBits = 24,
    .extension = "TIF"sv,
    .description = "(TIF) TIFF"sv,
    .enabled = 1,
    .flags = FMT_BITMAP | FMT_MULTI | FMT_PAGES | FMT_LAYERED | FMT_ALPHA,
    .canRead = true,
    .canWrite = true,
    .signatures = kSignatures,
    .keepsMetadata = kAllMetadata & ~kLostMakerNote,
    .bare = MakeBareTiff,
    .bareKeepsOrientation = true,
    .sequence = TiffSequenceBegin,
    .hasOptionsBox = true,
    .settings = &kSettings,
    .libraries = kLibraries,
}};

}  // namespace

std::span<const FormatEntry> TiffRows() { return kRows; }

}  // namespace fotomill
