#include "formats/rows.h"

#include "formats/macpaint/mac.h"
#include "texts/texts.h"

namespace fotomill {

namespace {

using namespace std::string_view_literals;

constexpr FormatSetting kKeys[] = {
    {"CreateMacbinaryHeader", TrLater("Add a MacBinary header")},
    {"FXMonoDither"},
    {"FXThreshold"},
};
constexpr FormatSettings kSettings = {"MAC", "OverrideMacBox", TrLater("MacPaint"), kKeys};

constexpr FormatEntry kRows[] = {{
    .info = MacInfo,
    .read = MacRead,
    .write = MacWrite,
    .maxBits = 1,
    .extension = "MAC"sv,
    .description = "(MAC) MacPaint"sv,
    .enabled = 1,
    .flags = FMT_BITMAP,
    .canRead = true,
    .canWrite = true,
    .settings = &kSettings,
}};

}  // namespace

std::span<const FormatEntry> MacPaintRows() { return kRows; }

}  // namespace fotomill
