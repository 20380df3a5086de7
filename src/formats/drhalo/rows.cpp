#include "formats/rows.h"

#include "formats/drhalo/cut.h"

namespace fotomill {

namespace {

using namespace std::string_view_literals;

constexpr FormatEntry kRows[] = {{
    .info = CutInfo,
    .read = CutRead,
    .write = CutWrite,
    .maxBits = 8,
    .limits = {UINT16_MAX, UINT16_MAX},
    .extension = "CUT"sv,
    .description = "(CUT) Dr. Halo"sv,
    .enabled = 1,
    .flags = FMT_BITMAP,
    .canRead = true,
    .canWrite = true,
}};

}  // namespace

std::span<const FormatEntry> DrHaloRows() { return kRows; }

}  // namespace fotomill
