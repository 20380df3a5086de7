#include "formats/rows.h"

#include "formats/casio/cam.h"

namespace fotomill {

namespace {

using namespace std::string_view_literals;

constexpr Signature kSignatures[] = {{0, "\x07\x20MM"sv, "Casio CAM"}};

constexpr FormatEntry kRows[] = {{
    .details = CamDetails,
    .info = CamInfo,
    .read = CamRead,
    .maxBits = 24,
    .extension = "CAM"sv,
    .description = "(CAM) Casio Digital Camera"sv,
    .enabled = 1,
    .flags = FMT_BITMAP | FMT_SECONDARY,
    .canRead = true,
    .whyNot = kOnlyRead,
    .signatures = kSignatures,
}};

}  // namespace

std::span<const FormatEntry> CasioRows() { return kRows; }

}  // namespace fotomill
