#include "formats/rows.h"

#include "formats/cameraraw/kdc.h"
#include "formats/cameraraw/raw_library.h"
#include "texts/texts.h"

namespace fotomill {

namespace {

using namespace std::string_view_literals;

// The same as TIFF, which is the better-known format.
constexpr Signature kSignatures[] = {{0, "II\x2a\0"sv}, {0, "MM\0\x2a"sv}};

constexpr FormatLibrary kLibraries[] = {
    {"LibRaw", RawLibraryVersion, TrLater("camera raw files, loaded when needed")}};

constexpr FormatEntry kRows[] = {{
    .info = KdcInfo,
    .read = KdcRead,
    .maxBits = 24,
    .extension = "KDC"sv,
    .description = "(KDC) Kodak Digital Camera"sv,
    .enabled = 1,
    .flags = FMT_BITMAP | FMT_SECONDARY,
    .canRead = true,
    .childTask = &kRawTask,
    .whyNot = kOnlyRead,
    .signatures = kSignatures,
    .libraries = kLibraries,
}};

}  // namespace

std::span<const FormatEntry> CameraRawRows() { return kRows; }

}  // namespace fotomill
