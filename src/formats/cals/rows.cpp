#include "formats/rows.h"

#include "formats/cals/cals.h"
#include "texts/texts.h"

namespace fotomill {

namespace {

using namespace std::string_view_literals;

constexpr Signature kSignatures[] = {{0, "srcdocid:"sv, TrLater("a CALS raster")}};

constexpr FormatEntry Row(std::string_view extension) {
  return {.info = CalsInfo,
          .read = CalsRead,
          .write = CalsWrite,
          .maxBits = 1,
          .limits = {999999, 999999},  // six digits
          .extension = extension,
          .description = "(CAL) CALS"sv,
          .enabled = 1,
          .flags = FMT_BITMAP | FMT_SECONDARY,
          .canRead = true,
          .canWrite = true,
          .signatures = kSignatures};
}

constexpr FormatEntry kRows[] = {Row("CAL"), Row("CALS")};

}  // namespace

std::span<const FormatEntry> CalsRows() { return kRows; }

}  // namespace fotomill
