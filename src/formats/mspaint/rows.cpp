#include "formats/rows.h"

#include "formats/mspaint/msp.h"
#include "texts/texts.h"

namespace fotomill {

namespace {

using namespace std::string_view_literals;

constexpr Signature kSignatures[] = {{0, "DanM"sv, TrLater("a Microsoft Paint picture")},
                                     {0, "LinS"sv, TrLater("a Microsoft Paint picture")}};

constexpr FormatEntry kRows[] = {{
    .info = MspInfo,
    .read = MspRead,
    .write = MspWrite,
    .maxBits = 1,
    .limits = {UINT16_MAX, UINT16_MAX},
    .extension = "MSP"sv,
    .description = "(MSP) Microsoft Paint"sv,
    .enabled = 1,
    .flags = FMT_BITMAP,
    .canRead = true,
    .canWrite = true,
    .signatures = kSignatures,
}};

}  // namespace

std::span<const FormatEntry> MsPaintRows() { return kRows; }

}  // namespace fotomill
