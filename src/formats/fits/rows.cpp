#include "formats/rows.h"

#include "formats/fits/fits.h"

namespace fotomill {

namespace {

using namespace std::string_view_literals;

constexpr Signature kSignatures[] = {{0, "SIMPLE  ="sv, "FITS"}};

constexpr FormatEntry Row(std::string_view extension, std::string_view description,
                          uint32_t flags) {
  return {.details = FitsDetails,
          .info = FitsInfo,
          .read = FitsRead,
          .write = FitsWrite,
          .maxBits = 24,
          .extension = extension,
          .description = description,
          .enabled = 1,
          .flags = flags,
          .canRead = true,
          .canWrite = true,
          .signatures = kSignatures};
}

constexpr FormatEntry kRows[] = {
    Row("FIT", "(FIT) Flexible Image Transport", FMT_BITMAP),
    Row("FTS", "(FTS) Flex. Image Transport", FMT_BITMAP | FMT_SECONDARY),
};

}  // namespace

std::span<const FormatEntry> FitsRows() { return kRows; }

}  // namespace fotomill
