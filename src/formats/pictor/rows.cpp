#include "formats/rows.h"

#include "formats/pictor/pic.h"
#include "formats/pictor/pictor.h"
#include "texts/texts.h"

namespace fotomill {

namespace {

using namespace std::string_view_literals;

// A bitmap whose compression starts with "JP", in color and in gray.
constexpr Signature kSignatures[] = {{0, "BM"sv, "Pegasus JPEG", 26, "\1\0\x18\0JP"sv},
                                     {0, "BM"sv, "Pegasus JPEG", 26, "\1\0\x08\0JP"sv},
                                     {0, "\x34\x12"sv, "Pictor"},
                                     {0, "\xff\xd8\xff"sv}};
constexpr Signature kLesserSignatures[] = {{0, "BM"sv, {}, 26, "\1\0\x18\0JP"sv},
                                           {0, "BM"sv, {}, 26, "\1\0\x08\0JP"sv},
                                           {0, "\xff\xd8\xff"sv}};

constexpr FormatEntry kRows[] = {
    {
        .details = PicDetails,
        .info = PicInfo,
        .read = PicRead,
        .write = PictorWrite,
        .maxBits = 24,
        .limits = {UINT16_MAX, UINT16_MAX},
        .extension = "PIC"sv,
        .description = "(PIC) GLPaint/Pegasus"sv,
        .enabled = 1,
        .flags = FMT_BITMAP,
        .canRead = true,
        .canWrite = true,
        .signatures = kSignatures,
    },
    {
        .details = PicDetails,
        .info = PicInfo,
        .read = PicRead,
        .maxBits = 24,
        .extension = "KQP"sv,
        .description = "(KQP) Konica Quality Photos"sv,
        .enabled = 1,
        .flags = FMT_BITMAP | FMT_SECONDARY,
        .canRead = true,
        .whyNot = kOnlyRead,
        .signatures = kLesserSignatures,
    },
};

}  // namespace

std::span<const FormatEntry> PictorRows() { return kRows; }

}  // namespace fotomill
