#include "formats/rows.h"

#include <libdeflate.h>
#include <png.h>
#include <zlib.h>

#include "containers/bare_file.h"
#include "formats/png/png.h"
#include "texts/texts.h"

namespace fotomill {

namespace {

using namespace std::string_view_literals;

constexpr Signature kSignatures[] = {{0, "\x89PNG\r\n\x1a\n"sv, "PNG"}};

constexpr FormatSetting kKeys[] = {
    {"PngCompression", TrLater("Compression, 0 (fastest) to 9 (smallest)")}};
constexpr FormatSettings kSettings = {"PNG", "OverridePngBox", TrLater("PNG"), kKeys};

std::string PngVersion() { return PNG_LIBPNG_VER_STRING; }
std::string ZlibVersion() { return zlibVersion(); }
std::string DeflateVersion() { return LIBDEFLATE_VERSION_STRING; }
constexpr FormatLibrary kLibraries[] = {
    {"libpng", PngVersion, TrLater("PNG")},
    {"zlib", ZlibVersion, TrLater("PNG")},
    {"libdeflate", DeflateVersion, TrLater("PNG and TIFF")},
};

constexpr FormatEntry kRows[] = {{
    .details = PngDetails,
    .info = PngInfo,
    .read = PngRead,
    .write = PngWrite,
    .maxBits = 24,
    .extension = "PNG"sv,
    .description = "(PNG) Portable Network Graphics"sv,
    .enabled = 1,
    .flags = FMT_BITMAP | FMT_MULTI | FMT_ANIMATED | FMT_PAGES | FMT_FRAMES | FMT_PNG |
             FMT_LAYERED | FMT_TRANSPARENT | FMT_SAVE_ANYWAY | FMT_ALPHA,
    .animate = PngAnimate,
    .canRead = true,
    .canWrite = true,
    .signatures = kSignatures,
    .keepsMetadata = kAllMetadata,
    .bare = MakeBarePng,
    .sequence = PngSequenceBegin,
    .hasOptionsBox = true,
    .settings = &kSettings,
    .libraries = kLibraries,
}};

}  // namespace

std::span<const FormatEntry> PngRows() { return kRows; }

}  // namespace fotomill
