#include "formats/rows.h"

#include "formats/sgi/sgi.h"
#include "texts/texts.h"

namespace fotomill {

namespace {

using namespace std::string_view_literals;

constexpr Signature kSignatures[] = {{0, "\x01\xda\0"sv, TrLater("an SGI image")},
                                     {0, "\x01\xda\1"sv, TrLater("an SGI image")}};

constexpr FormatEntry Row(std::string_view extension, std::string_view description,
                          uint32_t flags) {
  return {.info = SgiInfo,
          .read = SgiRead,
          .write = SgiWrite,
          .maxBits = 24,
          .limits = {UINT16_MAX, UINT16_MAX},
          .extension = extension,
          .description = description,
          .enabled = 1,
          .flags = FMT_BITMAP | FMT_ALPHA | flags,
          .canRead = true,
          .canWrite = true,
          .signatures = kSignatures};
}

constexpr FormatEntry kRows[] = {
    Row("SGI", "(SGI) Silicon Graphics", 0),
    Row("RGB", "(RGB) Silicon Graphics", FMT_SECONDARY),
};

}  // namespace

std::span<const FormatEntry> SgiRows() { return kRows; }

}  // namespace fotomill
