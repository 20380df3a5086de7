#include "formats/rows.h"

#include "formats/gem/gem.h"

namespace fotomill {

namespace {

using namespace std::string_view_literals;

constexpr Signature kSignatures[] = {
    {0, "\0\1"sv, "GEM IMG", 16, "XIMG"sv},
    {0, "\0\1"sv, "GEM IMG", 16, "STTT"sv},
    {0, "\0\1\0\x08\0\1"sv, "GEM IMG"},
};

constexpr FormatEntry kRows[] = {{
    .info = GemInfo,
    .read = GemRead,
    .write = GemWrite,
    .maxBits = 24,
    .limits = {UINT16_MAX, UINT16_MAX},
    .extension = "IMG"sv,
    .description = "(IMG) GEM/Ventura"sv,
    .enabled = 1,
    .flags = FMT_BITMAP,
    .canRead = true,
    .canWrite = true,
    .signatures = kSignatures,
}};

}  // namespace

std::span<const FormatEntry> GemRows() { return kRows; }

}  // namespace fotomill
