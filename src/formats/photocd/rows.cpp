#include "formats/rows.h"

#include "formats/photocd/pcd.h"
#include "texts/texts.h"

namespace fotomill {

namespace {

using namespace std::string_view_literals;

constexpr Signature kSignatures[] = {{0, "PCD_OPA"sv, TrLater("a Photo CD overview")}};

constexpr FormatSetting kKeys[] = {{"PhotoCDResolution", TrLater("Largest size read")}};
constexpr FormatSettings kSettings = {"PCD", "OverridePcdBox", TrLater("Photo CD"), kKeys};

constexpr FormatEntry kRows[] = {{
    .details = PcdDetails,
    .info = PcdInfo,
    .read = PcdRead,
    .maxBits = 24,
    .extension = "PCD"sv,
    .description = "(PCD) Kodak Photo-CD"sv,
    .enabled = 1,
    .flags = FMT_BITMAP | FMT_MEDIA,
    .canRead = true,
    .whyNot = kOnlyRead,
    .signatures = kSignatures,
    .settings = &kSettings,
}};

}  // namespace

std::span<const FormatEntry> PhotoCdRows() { return kRows; }

}  // namespace fotomill
