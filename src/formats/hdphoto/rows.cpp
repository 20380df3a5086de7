#include "formats/rows.h"

#include "formats/hdphoto/hdp.h"
#include "formats/hdphoto/hdp_codec.h"
#include "texts/texts.h"

namespace fotomill {

namespace {

using namespace std::string_view_literals;

constexpr Signature kSignatures[] = {{0, "II\xbc\x01"sv, "JPEG XR"}};

constexpr FormatSetting kKeys[] = {
    {"HDPCompression", TrLater("Compression, 0 (lossless) to 255 (smallest)")},
    {"TiffResolution"},
};
constexpr FormatSettings kSettings = {"HDP", "OverrideHdpBox", TrLater("HD Photo"), kKeys};

std::string JxrVersion() { return HdpWorksHere() ? "present" : "missing"; }
constexpr FormatLibrary kLibraries[] = {
    {"libjxr", JxrVersion, TrLater("HD Photo, loaded when needed")}};

constexpr uint32_t kFlags = FMT_BITMAP | FMT_MULTI | FMT_PAGES | FMT_FRAMES | FMT_LAYERED;

constexpr FormatEntry Row(std::string_view extension, std::string_view description, uint32_t flags,
                          DetailsOperation details, bool hasOptionsBox) {
  return {.details = details,
          .info = HdpInfo,
          .read = HdpRead,
          .write = HdpWrite,
          .maxBits = 24,
          .extension = extension,
          .description = description,
          .enabled = 1,
          .flags = flags,
          .canRead = true,
          .canWrite = true,
          .childTask = &kHdpTask,
          .present = HdpWorksHere,
          .whyNot = TrLater("The library libjxr is not installed."),
          .signatures = kSignatures,
          .keepsMetadata = kAllMetadata & ~kLostMakerNote,
          .hasOptionsBox = hasOptionsBox,
          .settings = &kSettings,
          .libraries = kLibraries};
}

constexpr FormatEntry kRows[] = {
    Row("HDP", "(HDP) HD Photo", kFlags, HdpDetails, true),
    Row("WDP", "(WDP) HD Photo", kFlags | FMT_SECONDARY, nullptr, false),
};

}  // namespace

std::span<const FormatEntry> HdPhotoRows() { return kRows; }

}  // namespace fotomill
