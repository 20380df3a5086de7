#include "formats/rows.h"

#include <webp/decode.h>
#include <webp/encode.h>

#include "containers/bare_file.h"
#include "formats/webp/webp.h"
#include "texts/texts.h"

namespace fotomill {

namespace {

using namespace std::string_view_literals;

constexpr Signature kSignatures[] = {{0, "RIFF"sv, "WebP", 8, "WEBP"sv}};

constexpr FormatSetting kKeys[] = {
    {"WebPLossless", TrLater("Lossless")},
    {"WebPQualityFactor", TrLater("Quality")},
    {"WebPAllowMixed", TrLater("Try both and keep the smaller file")},
};
constexpr FormatSettings kSettings = {"WEBP", "OverrideWebPBox", TrLater("WebP"), kKeys};

std::string WebpVersion() {
  const int version = WebPGetDecoderVersion();
  return std::to_string(version >> 16) + "." + std::to_string(version >> 8 & 255) + "." +
         std::to_string(version & 255);
}
constexpr FormatLibrary kLibraries[] = {{"libwebp", WebpVersion, TrLater("WebP")}};

constexpr FormatEntry kRows[] = {{
    .info = WebpInfo,
    .read = WebpRead,
    .write = WebpWrite,
    .maxBits = 24,
    .limits = {WEBP_MAX_DIMENSION, WEBP_MAX_DIMENSION},
    .extension = "WEBP"sv,
    .description = "(WEBP) Google WebP"sv,
    .enabled = 1,
    .flags = FMT_BITMAP | FMT_MULTI | FMT_ANIMATED | FMT_TIMED | FMT_FRAMES | FMT_LAYERED |
             FMT_TRANSPARENT | FMT_ALPHA,
    .animate = WebpAnimate,
    .canRead = true,
    .canWrite = true,
    .signatures = kSignatures,
    .keepsMetadata = kAllMetadata & ~(kLostComment | kLostGrayIcc),
    .bare = MakeBareWebp,
    .sequence = WebpSequenceBegin,
    .hasOptionsBox = true,
    .settings = &kSettings,
    .libraries = kLibraries,
}};

}  // namespace

std::span<const FormatEntry> WebpRows() { return kRows; }

}  // namespace fotomill
