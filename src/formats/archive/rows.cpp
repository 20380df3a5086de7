#include "formats/rows.h"

#include "archive/archive_reader.h"
#include "formats/archive/archive_picture.h"
#include "texts/texts.h"

namespace fotomill {

namespace {

using namespace std::string_view_literals;

constexpr Signature kRarSignatures[] = {{0, "Rar!\x1A\7"sv, TrLater("a RAR archive")}};
constexpr Signature kZipSignatures[] = {{0, "PK\3\4"sv, TrLater("a ZIP archive")}};

constexpr FormatLibrary kLibraries[] = {
    {"libarchive", ArchiveLibraryVersion, TrLater("ZIP and RAR archives, loaded when needed")}};

constexpr uint32_t kFlags =
    FMT_BITMAP | FMT_MULTI | FMT_PAGES | FMT_CONTAINER | FMT_LAYERED | FMT_SECONDARY | FMT_ARCHIVE;

// Do not load the library before an archive is opened; that would slow down startup.
int32_t Ready() { return 1; }

constexpr FormatEntry Row(std::string_view extension, std::string_view description,
                          std::span<const Signature> signatures) {
  return {.info = ArchivePictureInfo,
          .read = ArchivePictureRead,
          .startup = Ready,
          .shutdown = Ready,
          .maxBits = 24,
          .extension = extension,
          .description = description,
          .enabled = 1,
          .flags = kFlags,
          .canRead = true,
          .canStartUp = true,
          .childTask = &kArchiveTask,
          .present = HasArchiveLibrary,
          .whyNot = kOnlyRead,
          .signatures = signatures,
          .libraries = kLibraries};
}

constexpr FormatEntry kRows[] = {
    Row("RAR", "(RAR) RAR archive", kRarSignatures),
    Row("ZIP", "(ZIP) ZIP archive", kZipSignatures),
};

}  // namespace

std::span<const FormatEntry> ArchiveRows() { return kRows; }

}  // namespace fotomill
