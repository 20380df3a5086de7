#include "formats/rows.h"

#include "formats/sunraster/ras.h"
#include "texts/texts.h"

namespace fotomill {

namespace {

using namespace std::string_view_literals;

constexpr Signature kSignatures[] = {{0, "\x59\xa6\x6a\x95"sv, TrLater("a Sun raster")}};

constexpr FormatEntry kRows[] = {{
    .info = RasInfo,
    .read = RasRead,
    .write = RasWrite,
    .maxBits = 24,
    .extension = "RAS"sv,
    .description = "(RAS) Sun Raster"sv,
    .enabled = 1,
    .flags = FMT_BITMAP,
    .canRead = true,
    .canWrite = true,
    .signatures = kSignatures,
}};

}  // namespace

std::span<const FormatEntry> SunRasterRows() { return kRows; }

}  // namespace fotomill
