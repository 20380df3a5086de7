#include "formats/rows.h"

#include "formats/wbmp/wbmp.h"

namespace fotomill {

namespace {

using namespace std::string_view_literals;

constexpr FormatEntry kRows[] = {{
    .info = WbmpInfo,
    .read = WbmpRead,
    .write = WbmpWrite,
    .maxBits = 1,
    .extension = "WBMP"sv,
    .description = "(WBMP) WAP bitmap"sv,
    .enabled = 1,
    .flags = FMT_BITMAP,
    .canRead = true,
    .canWrite = true,
}};

}  // namespace

std::span<const FormatEntry> WbmpRows() { return kRows; }

}  // namespace fotomill
