#include "formats/rows.h"

#include "formats/amiga/iff.h"
#include "texts/texts.h"

namespace fotomill {

namespace {

using namespace std::string_view_literals;

constexpr Signature kSignatures[] = {{0, "FORM"sv, "IFF", 8, "ILBM"sv},
                                     {0, "FORM"sv, "IFF", 8, "PBM "sv}};
constexpr Signature kLesserSignatures[] = {{0, "FORM"sv, {}, 8, "ILBM"sv},
                                           {0, "FORM"sv, {}, 8, "PBM "sv}};

constexpr FormatSetting kKeys[] = {
    {"CreateIffCompressed", TrLater("Compressed")},
    {"CreateIffPBM", TrLater("Palette pictures as PBM")},
};
constexpr FormatSettings kSettings = {"IFF", "OverrideIffBox", TrLater("Amiga IFF"), kKeys};

constexpr FormatEntry Row(std::string_view extension, std::string_view description,
                          uint32_t maxBits, WriteOperation write,
                          std::span<const Signature> signatures, uint32_t flags = 0) {
  return {.details = IffDetails,
          .info = IffInfo,
          .read = IffRead,
          .write = write,
          .maxBits = maxBits,
          .limits = {UINT16_MAX, UINT16_MAX},
          .extension = extension,
          .description = description,
          .enabled = 1,
          .flags = FMT_BITMAP | flags,
          .canRead = true,
          .canWrite = true,
          .signatures = signatures,
          .settings = &kSettings};
}

constexpr FormatEntry kRows[] = {
    Row("IFF", "(IFF) Amiga", 24, IffWrite, kSignatures),
    Row("LBM", "(LBM) Amiga", 8, IffWrite, kLesserSignatures),
    Row("HAM", "(HAM) Amiga", 24, HamWrite, kLesserSignatures, FMT_SECONDARY),
};

}  // namespace

std::span<const FormatEntry> AmigaRows() { return kRows; }

}  // namespace fotomill
