#include "formats/rows.h"

#include "formats/flashpix/fpx.h"
#include "texts/texts.h"

namespace fotomill {

namespace {

using namespace std::string_view_literals;

constexpr Signature kSignatures[] = {
    {0, "\xd0\xcf\x11\xe0\xa1\xb1\x1a\xe1"sv, TrLater("a compound file")}};

constexpr FormatEntry kRows[] = {{
    .details = FpxDetails,
    .info = FpxInfo,
    .read = FpxRead,
    .maxBits = 24,
    .extension = "FPX"sv,
    .description = "(FPX) FlashPix"sv,
    .enabled = 1,
    .flags = FMT_BITMAP | FMT_SECONDARY,
    .canRead = true,
    .whyNot = kOnlyRead,
    .signatures = kSignatures,
}};

}  // namespace

std::span<const FormatEntry> FlashPixRows() { return kRows; }

}  // namespace fotomill
