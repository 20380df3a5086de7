#include "formats/rows.h"

#include "formats/targa/tga.h"
#include "texts/texts.h"

namespace fotomill {

namespace {

using namespace std::string_view_literals;

constexpr FormatSetting kKeys[] = {{"CreateTarga16", TrLater("16 bits per pixel")}};
constexpr FormatSettings kSettings = {"TGA", "OverrideTgaBox", TrLater("Targa"), kKeys};

constexpr FormatEntry kRows[] = {{
    .info = TgaInfo,
    .read = TgaRead,
    .write = TgaWrite,
    .maxBits = 24,
    .limits = {UINT16_MAX, UINT16_MAX},
    .extension = "TGA"sv,
    .description = "(TGA) Targa"sv,
    .enabled = 1,
    .flags = FMT_BITMAP | FMT_ALPHA,
    .canRead = true,
    .canWrite = true,
    .settings = &kSettings,
}};

}  // namespace

std::span<const FormatEntry> TargaRows() { return kRows; }

}  // namespace fotomill
