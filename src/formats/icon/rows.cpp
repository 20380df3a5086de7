#include "formats/rows.h"

#include "formats/icon/ico.h"
#include "texts/texts.h"

namespace fotomill {

namespace {

using namespace std::string_view_literals;

// Either row reads both kinds of file.
constexpr std::string_view kIcon = "\0\0\1\0"sv, kCursor = "\0\0\2\0"sv;
constexpr Signature kIconSignatures[] = {{0, kIcon, TrLater("an icon")}, {0, kCursor}};
constexpr Signature kCursorSignatures[] = {{0, kCursor, TrLater("a cursor")}, {0, kIcon}};

constexpr FormatSetting kKeys[] = {{"ICOCompression", TrLater("Icons (ICO): compression")}};
constexpr FormatSettings kSettings = {"ICO", "OverrideIcoBox", TrLater("Other formats"), kKeys};

constexpr FormatEntry Row(std::string_view extension, std::string_view description, uint32_t flags,
                          std::span<const Signature> signatures, bool hasOptionsBox) {
  return {.info = IcoInfo,
          .read = IcoRead,
          .write = IcoWrite,
          .maxBits = 24,
          .limits = {256, 256},
          .extension = extension,
          .description = description,
          .enabled = 1,
          .flags = flags,
          .canRead = true,
          .canWrite = true,
          .signatures = signatures,
          .hasOptionsBox = hasOptionsBox,
          .settings = &kSettings};
}

constexpr FormatEntry kRows[] = {
    Row("ICO", "(ICO) Windows icon",
        FMT_BITMAP | FMT_MULTI | FMT_PAGES | FMT_CONTAINER | FMT_LAYERED | FMT_TRANSPARENT |
            FMT_ALPHA,
        kIconSignatures, true),
    Row("CUR", "(CUR) Windows cursor", FMT_BITMAP | FMT_SECONDARY | FMT_ALPHA, kCursorSignatures,
        false),
};

}  // namespace

std::span<const FormatEntry> IconRows() { return kRows; }

}  // namespace fotomill
