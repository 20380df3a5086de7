#include "formats/rows.h"

#include "formats/bmp/bmp.h"
#include "texts/texts.h"

namespace fotomill {

namespace {

using namespace std::string_view_literals;

constexpr Signature kSignatures[] = {
    {0, "BM"sv, "BMP", 6, "\0\0\0\0"sv},
    {0, "BA"sv, {}, 14, "BM"sv},  // the first picture of an OS/2 bitmap array
};

constexpr FormatSetting kKeys[] = {{"WriteOS2Bitmaps", TrLater("Bitmaps (BMP): OS/2 version")}};
constexpr FormatSettings kSettings = {"BMP", "OverrideBmpBox", TrLater("Other formats"), kKeys};

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
};

}  // namespace

std::span<const FormatEntry> BmpRows() { return kRows; }

}  // namespace fotomill
