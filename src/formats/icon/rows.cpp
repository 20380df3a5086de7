#include "formats/rows.h"

#include "formats/icon/ani.h"
#include "formats/icon/ico.h"
#include "texts/texts.h"

namespace fotomill {

namespace {

using namespace std::string_view_literals;

// Both rows read both kinds of file.
constexpr std::string_view kIcon = "\0\0\1\0"sv, kCursor = "\0\0\2\0"sv;
constexpr Signature kIconSignatures[] = {{0, kIcon, TrLater("an icon")}, {0, kCursor}};
constexpr Signature kCursorSignatures[] = {{0, kCursor, TrLater("a cursor")}, {0, kIcon}};

constexpr Signature kAniSignatures[] = {{0, "RIFF"sv, TrLater("an animated cursor"), 8, "ACON"sv}};

constexpr FormatSetting kKeys[] = {
    {"ICOCompression", TrLater("Compression")},
    {"IconCompleteStack", TrLater("All pages of a file become sizes")},
};
constexpr FormatSettings kSettings = {"ICO", "OverrideIcoBox", TrLater("Windows icon"), kKeys};

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
          .sequence = (flags & FMT_MULTI) != 0 ? IcoSequenceBegin : nullptr,
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
    {.info = AniInfo,
     .read = AniRead,
     .write = AniWrite,
     .maxBits = 24,
     .limits = {256, 256},
     .extension = "ANI"sv,
     .description = "(ANI) Windows animated cursor"sv,
     .enabled = 1,
     .flags = FMT_BITMAP | FMT_MULTI | FMT_ANIMATED | FMT_TIMED | FMT_FRAMES | FMT_LAYERED |
              FMT_SECONDARY | FMT_TRANSPARENT,
     .animate = AniAnimate,
     .canRead = true,
     .canWrite = true,
     .signatures = kAniSignatures},
};

}  // namespace

std::span<const FormatEntry> IconRows() { return kRows; }

}  // namespace fotomill
