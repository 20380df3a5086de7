#include "formats/rows.h"

#include "formats/uuencode/uue.h"
#include "texts/texts.h"

namespace fotomill {

namespace {

using namespace std::string_view_literals;

constexpr Signature kSignatures[] = {{0, "begin "sv, "UUE"}};

constexpr FormatSetting kKeys[] = {
    {"RelaxedUUE", TrLater("Skip damaged lines")},
};
constexpr FormatSettings kSettings = {"UUE", "OverrideUueBox", TrLater("UUEncoded"), kKeys};

constexpr FormatEntry kRows[] = {{
    .info = UueInfo,
    .read = UueRead,
    .write = UueWrite,
    .maxBits = 24,
    .limits = {65500, 65500},  // of the embedded JPEG
    .extension = "UUE"sv,
    .description = "(UUE) UUEncoded graphics"sv,
    .enabled = 1,
    .flags = FMT_BITMAP | FMT_SECONDARY,
    .canRead = true,
    .canWrite = true,
    .signatures = kSignatures,
    .keepsMetadata = kAllMetadata,
    .settings = &kSettings,
}};

}  // namespace

std::span<const FormatEntry> UuencodeRows() { return kRows; }

}  // namespace fotomill
