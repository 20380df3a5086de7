#include "formats/rows.h"

#include "formats/photoshop/psd.h"
#include "formats/photoshop/psd_file.h"

namespace fotomill {

namespace {

using namespace std::string_view_literals;

constexpr Signature kSignatures[] = {{0, "8BPS\0\1"sv, "Photoshop"}};
constexpr Signature kLesserSignatures[] = {{0, "8BPS\0\1"sv}};

constexpr FormatEntry Row(std::string_view extension, std::string_view description,
                          std::span<const Signature> signatures) {
  return {.details = PsdDetails,
          .info = PsdInfo,
          .read = PsdRead,
          .write = PsdWrite,
          .maxBits = 24,
          .limits = {kLongestPsdSide, kLongestPsdSide},
          .extension = extension,
          .description = description,
          .enabled = 1,
          .flags = FMT_BITMAP,
          .canRead = true,
          .canWrite = true,
          .signatures = signatures,
          .keepsMetadata = kAllMetadata & ~kLostComment};
}

constexpr FormatEntry kRows[] = {
    Row("PDD", "(PDD) Adobe Photoshop 2.5", kLesserSignatures),
    Row("PSD", "(PSD) Adobe Photoshop 2.5", kSignatures),
};

}  // namespace

std::span<const FormatEntry> PhotoshopRows() { return kRows; }

}  // namespace fotomill
