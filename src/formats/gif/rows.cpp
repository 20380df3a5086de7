#include "formats/rows.h"

#include "formats/gif/gif.h"
#include "texts/texts.h"

namespace fotomill {

namespace {

using namespace std::string_view_literals;

constexpr Signature kSignatures[] = {{0, "GIF87a"sv, "GIF"}, {0, "GIF89a"sv, "GIF"}};

constexpr FormatSetting kKeys[] = {
    {"WriteGIFInterlaced", TrLater("Interlaced")},
    {"CreateGif89", TrLater("Version 89a, with comments and transparency")},
    {"MultipleImageGIF", TrLater("All pages of a file become frames")},
    {"FXColorDither"},
    {"FXBidirectional"},
};
constexpr FormatSettings kSettings = {"GIF", "OverrideGifBox", TrLater("GIF"), kKeys};

constexpr FormatEntry kRows[] = {{
    .details = GifDetails,
    .info = GifInfo,
    .read = GifRead,
    .write = GifWrite,
    .maxBits = 8,
    .limits = {UINT16_MAX, UINT16_MAX},
    .extension = "GIF"sv,
    .description = "(GIF) CompuServe"sv,
    .enabled = 1,
    .flags = FMT_BITMAP | FMT_MULTI | FMT_ANIMATED | FMT_PAGES | FMT_TIMED | FMT_FRAMES |
             FMT_LAYERED | FMT_TRANSPARENT,
    .animate = GifAnimate,
    .canRead = true,
    .canWrite = true,
    .signatures = kSignatures,
    .keepsMetadata = kLostComment,
    .sequence = GifSequenceBegin,
    .settings = &kSettings,
}};

}  // namespace

std::span<const FormatEntry> GifRows() { return kRows; }

}  // namespace fotomill
