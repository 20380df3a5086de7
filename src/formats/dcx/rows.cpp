#include "formats/rows.h"

#include "formats/dcx/dcx.h"

namespace fotomill {

namespace {

using namespace std::string_view_literals;

constexpr Signature kSignatures[] = {{0, "\xb1\x68\xde\x3a"sv, "DCX"}};

constexpr FormatEntry kRows[] = {{
    .info = DcxInfo,
    .read = DcxRead,
    .write = DcxWrite,
    .maxBits = 24,
    .limits = {UINT16_MAX + 1, UINT16_MAX + 1},
    .extension = "DCX"sv,
    .description = "(DCX) DCX FAX"sv,
    .enabled = 1,
    .flags = FMT_BITMAP | FMT_MULTI | FMT_PAGES,
    .canRead = true,
    .canWrite = true,
    .signatures = kSignatures,
    .sequence = DcxSequenceBegin,
}};

}  // namespace

std::span<const FormatEntry> DcxRows() { return kRows; }

}  // namespace fotomill
