#include "formats/rows.h"

#include "formats/paintshop/psp.h"

namespace fotomill {

namespace {

using namespace std::string_view_literals;

constexpr Signature kSignatures[] = {{0, "Paint Shop Pro Image File"sv, "Paint Shop Pro"}};

constexpr FormatEntry kRows[] = {{
    .details = PspDetails,
    .info = PspInfo,
    .read = PspRead,
    .write = PspWrite,
    .maxBits = 24,
    .extension = "PSP"sv,
    .description = "(PSP) PSP"sv,
    .enabled = 1,
    .flags = FMT_BITMAP | FMT_MULTI | FMT_PAGES | FMT_SECONDARY,
    .canRead = true,
    .canWrite = true,
    .signatures = kSignatures,
}};

}  // namespace

std::span<const FormatEntry> PaintShopRows() { return kRows; }

}  // namespace fotomill
