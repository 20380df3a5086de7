#pragma once

#include <cstddef>
#include <cstdint>
#include <span>
#include <string>
#include <string_view>
#include <vector>

namespace fotomill {

// A file's format according to its first bytes, whatever its name.
struct FileKind {
  // common name of the format: "AVIF"; empty if unknown
  std::string_view name;
  // of the registry rows and plug-ins that read such files, most likely first
  std::vector<std::string_view> extensions;
  bool IsOf(std::string_view extension) const;
};

// Bytes from the start of a file that are needed: the first 32, and 32 after the 512-byte header of
// a Macintosh picture.
inline constexpr size_t kSignatureBytes = 512 + 32;

// Identifies a file by its first kSignatureBytes bytes (fewer if it is shorter), by the longest
// matching signature.
FileKind IdentifySignature(std::span<const uint8_t> head);
// As above, for a file; empty if it cannot be opened.
FileKind IdentifyFile(const std::string& fileName);
// The actual format of a file whose name selects the wrong row `formatIndex` (kNoFormat: none).
// Empty if the contents match the name or cannot be identified.
FileKind KindBehindName(const std::string& fileName, int32_t formatIndex);

}  // namespace fotomill
