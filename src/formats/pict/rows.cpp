#include "formats/rows.h"

#include "formats/pict/pict.h"
#include "texts/texts.h"

namespace fotomill {

namespace {

using namespace std::string_view_literals;

// Version 2, without and with the preamble of files.
constexpr Signature kSignatures[] = {
    {10, "\0\x11\x02\xff"sv, TrLater("a Macintosh picture")},
    {522, "\0\x11\x02\xff\x0c\0"sv, TrLater("a Macintosh picture")}};

constexpr FormatEntry kRows[] = {{
    .details = PictDetails,
    .info = PictInfo,
    .read = PictRead,
    .write = PictWrite,
    .maxBits = 24,
    .limits = {8191, 32767},  // a row of 32-bit pixels has at most 32767 bytes
    .extension = "PCT"sv,
    .description = "(PCT) Macintosh PICT"sv,
    .enabled = 1,
    .flags = FMT_BITMAP | FMT_SECONDARY,
    .canRead = true,
    .canWrite = true,
    .signatures = kSignatures,
}};

}  // namespace

std::span<const FormatEntry> PictRows() { return kRows; }

}  // namespace fotomill
