#include "formats/rows.h"

#include "formats/xbm/xbm.h"

namespace fotomill {

namespace {

using namespace std::string_view_literals;

constexpr Signature kSignatures[] = {{0, "#define "sv, "XBM"}};

constexpr FormatEntry kRows[] = {{
    .info = XbmInfo,
    .read = XbmRead,
    .write = XbmWrite,
    .maxBits = 1,
    .extension = "XBM"sv,
    .description = "(XBM) XWindows bitmap"sv,
    .enabled = 1,
    .flags = FMT_BITMAP,
    .canRead = true,
    .canWrite = true,
    .signatures = kSignatures,
}};

}  // namespace

std::span<const FormatEntry> XbmRows() { return kRows; }

}  // namespace fotomill
