#include "formats/rows.h"

#include "formats/hrz/hrz.h"

namespace fotomill {

namespace {

using namespace std::string_view_literals;

constexpr FormatEntry kRows[] = {{
    .info = HrzInfo,
    .read = HrzRead,
    .write = HrzWrite,
    .maxBits = 24,
    .limits = {kHrzWidth, kHrzHeight, true},
    .extension = "HRZ"sv,
    .description = "(HRZ) SSTV"sv,
    .enabled = 1,
    .flags = FMT_BITMAP,
    .canRead = true,
    .canWrite = true,
}};

}  // namespace

std::span<const FormatEntry> HrzRows() { return kRows; }

}  // namespace fotomill
