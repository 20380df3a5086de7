#include "formats/rows.h"

#include "formats/bmp/bga.h"
#include "formats/bmp/bmp.h"
#include "formats/bmp/rle.h"
#include "texts/texts.h"

namespace fotomill {

namespace {

using namespace std::string_view_literals;

constexpr Signature kSignatures[] = {
    {0, "BM"sv, "BMP", 6, "\0\0\0\0"sv},
    {0, "BA"sv, {}, 14, "BM"sv},  // the first picture of an OS/2 bitmap array
};
constexpr Signature kRunSignatures[] = {{0, "BM"sv, {}, 6, "\0\0\0\0"sv}};
constexpr Signature kArraySignatures[] = {
    {0, "BA"sv, TrLater("an OS/2 bitmap array"), 14, "BM"sv},
    {0, "BA"sv, TrLater("an OS/2 icon"), 14, "CI"sv},
    {0, "BA"sv, TrLater("an OS/2 icon"), 14, "IC"sv},
    {0, "BA"sv, TrLater("an OS/2 pointer"), 14, "CP"sv},
    {0, "BA"sv, TrLater("an OS/2 pointer"), 14, "PT"sv},
    {0, "BM"sv, {}, 6, "\0\0\0\0"sv},
};

constexpr FormatSetting kKeys[] = {{"WriteOS2Bitmaps", TrLater("OS/2 version")}};
constexpr FormatSettings kSettings = {"BMP", "OverrideBmpBox", TrLater("Windows bitmap"), kKeys};

constexpr FormatEntry Row(std::string_view extension, std::string_view description,
                          DetailsOperation details) {
  return {.details = details,
          .info = BmpInfo,
          .read = BmpRead,
          .write = BmpWrite,
          .maxBits = 24,
          .extension = extension,
          .description = description,
          .enabled = 1,
          .flags = FMT_BITMAP | FMT_ALPHA,
          .canRead = true,
          .canWrite = true,
          .signatures = kSignatures,
          .settings = &kSettings};
}

constexpr FormatEntry kRows[] = {
    Row("BMP", "(BMP) Windows bitmap", BmpDetails),
    Row("DIB", "(DIB) Windows", nullptr),
    {.info = BmpInfo,
     .read = BmpRead,
     .write = RleWrite,
     .maxBits = 8,
     .extension = "RLE"sv,
     .description = "(RLE) Windows"sv,
     .enabled = 1,
     .flags = FMT_BITMAP,
     .canRead = true,
     .canWrite = true,
     .signatures = kRunSignatures},
    {.info = BgaInfo,
     .read = BgaRead,
     .write = BgaWrite,
     .maxBits = 24,
     .extension = "BGA"sv,
     .description = "(BGA) OS/2 Warp"sv,
     .enabled = 1,
     .flags = FMT_BITMAP | FMT_MULTI | FMT_PAGES | FMT_ALPHA,
     .canRead = true,
     .canWrite = true,
     .signatures = kArraySignatures},
};

}  // namespace

std::span<const FormatEntry> BmpRows() { return kRows; }

}  // namespace fotomill
