#include "formats/rows.h"

#include "formats/pcx/pcx.h"

namespace fotomill {

namespace {

using namespace std::string_view_literals;

constexpr Signature kSignatures[] = {{0, "\x0a\5\1"sv, "PCX"}};

constexpr FormatEntry kRows[] = {{
    .info = PcxInfo,
    .read = PcxRead,
    .write = PcxWrite,
    .maxBits = 24,
    .limits = {UINT16_MAX + 1, UINT16_MAX + 1},
    .extension = "PCX"sv,
    .description = "(PCX) PC Paintbrush"sv,
    .enabled = 1,
    .flags = FMT_BITMAP,
    .canRead = true,
    .canWrite = true,
    .signatures = kSignatures,
}};

}  // namespace

std::span<const FormatEntry> PcxRows() { return kRows; }

}  // namespace fotomill
