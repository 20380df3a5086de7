#pragma once

#include <cstddef>
#include <cstdint>
#include <span>
#include <string>
#include <string_view>
#include <vector>

namespace fotomill {

// What a file's first bytes say that it is, whatever its name.
struct FileKind {
  // as people call the format: "AVIF"; empty when nothing fits
  std::string_view name;
  // of the registry's rows and of plug-ins that mean such files, the likeliest first
  std::vector<std::string_view> extensions;
  bool IsOf(std::string_view extension) const;
};

// So many bytes from the start of a file decide: the first 32, and as many behind the 512 that
// precede a Macintosh picture.
inline constexpr size_t kSignatureBytes = 512 + 32;

// Recognises a file by its first kSignatureBytes bytes (fewer when it is shorter), by the longest
// signature that fits.
FileKind IdentifySignature(std::span<const uint8_t> head);
// The same for a file; nothing fits when it cannot be opened.
FileKind IdentifyFile(const std::string& fileName);
// What a file really is, if its name selects the wrong row `formatIndex` (kNoFormat: none). Nothing
// if the contents match the name, or give no clue.
FileKind KindBehindName(const std::string& fileName, int32_t formatIndex);

}  // namespace fotomill
