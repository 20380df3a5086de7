#include "formats/rows.h"

#include "formats/wordperfect/wpg.h"

namespace fotomill {

namespace {

using namespace std::string_view_literals;

constexpr Signature kSignatures[] = {{0, "\xffWPC"sv, TrLater("WordPerfect graphics")}};

constexpr FormatEntry kRows[] = {{
    .info = WpgInfo,
    .read = WpgRead,
    .write = WpgWrite,
    .maxBits = 8,
    .limits = {UINT16_MAX, UINT16_MAX},
    .extension = "WPG"sv,
    .description = "(WPG) WordPerfect Graphics"sv,
    .enabled = 1,
    .flags = FMT_BITMAP,
    .canRead = true,
    .canWrite = true,
    .signatures = kSignatures,
}};

}  // namespace

std::span<const FormatEntry> WordPerfectRows() { return kRows; }

}  // namespace fotomill
