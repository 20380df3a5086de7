#include "formats/rows.h"

#include <jconfig.h>
#include <jmorecfg.h>

#include "containers/bare_file.h"
#include "formats/jpeg/jpeg.h"
#include "texts/texts.h"

namespace fotomill {

namespace {

using namespace std::string_view_literals;

constexpr Signature kSignatures[] = {{0, "\xff\xd8\xff"sv, "JPEG"}};

constexpr FormatSetting kKeys[] = {
    {"JpegCompression", TrLater("Quality")},
    {"JpegSubsample", TrLater("Chroma subsampling")},
    {"WriteJpegProgressive", TrLater("Progressive")},
    {"JpegStoreDPI", TrLater("Store the resolution")},
    {"TiffResolution"},
    {"AlphaBackground"},
};
constexpr FormatSettings kSettings = {"JPG", "OverrideJpgBox", TrLater("JPEG"), kKeys};

#define FOTOMILL_QUOTED(text) #text
#define FOTOMILL_QUOTED_VALUE(macro) FOTOMILL_QUOTED(macro)
std::string TurboVersion() { return FOTOMILL_QUOTED_VALUE(LIBJPEG_TURBO_VERSION); }
constexpr FormatLibrary kLibraries[] = {{"libjpeg-turbo", TurboVersion, TrLater("JPEG")}};

constexpr FormatEntry Row(std::string_view extension, std::string_view description, int32_t enabled,
                          uint32_t flags) {
  const bool first = (flags & FMT_SECONDARY) == 0;
  return {.details = first ? JpegDetails : nullptr,
          .info = JpegInfo,
          .read = JpegRead,
          .write = JpegWrite,
          .maxBits = 24,
          .limits = {JPEG_MAX_DIMENSION, JPEG_MAX_DIMENSION},
          .extension = extension,
          .description = description,
          .enabled = enabled,
          .flags = flags,
          .canRead = true,
          .canWrite = true,
          .signatures = kSignatures,
          .keepsMetadata = kAllMetadata,
          .bare = MakeBareJpeg,
          .turnsWithoutLoss = true,
          .hasOptionsBox = first,
          .settings = &kSettings,
          .libraries = kLibraries};
}

constexpr FormatEntry kRows[] = {
    Row("JPG", "(JPG) Jpeg", 1, FMT_BITMAP),
    Row("JFI", "(JFI) Jpeg", 0, FMT_BITMAP | FMT_SECONDARY),
    Row("JFIF", "(JFIF) Jpeg", 1, FMT_BITMAP | FMT_SECONDARY),
    Row("JPE", "(JPE) Jpeg", 0, FMT_BITMAP | FMT_SECONDARY),
    Row("JPEG", "(JPEG) Jpeg", 1, FMT_BITMAP | FMT_SECONDARY),
};

}  // namespace

std::span<const FormatEntry> JpegRows() { return kRows; }

}  // namespace fotomill
