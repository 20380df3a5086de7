#include "formats/rows.h"

#include "formats/text/txt.h"
#include "texts/texts.h"

namespace fotomill {

namespace {

using namespace std::string_view_literals;

constexpr FormatSetting kKeys[] = {
    {"TextCharacterLevels", TrLater("Characters from light to dark")},
    {"InvertTextFiles", TrLater("Light text on a dark screen")},
};
constexpr FormatSettings kSettings = {"TXT", "OverrideTxtBox", TrLater("Text files"), kKeys};

constexpr FormatEntry kRows[] = {{
    .info = TxtInfo,
    .read = TxtRead,
    .write = TxtWrite,
    .maxBits = 24,
    .extension = "TXT"sv,
    .description = "(TXT) Text files"sv,
    .enabled = 1,
    .flags = FMT_BITMAP,
    .canRead = true,
    .canWrite = true,
    .settings = &kSettings,
}};

}  // namespace

std::span<const FormatEntry> TextRows() { return kRows; }

}  // namespace fotomill
