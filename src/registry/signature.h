#pragma once

#include <cstddef>
#include <cstdint>
#include <span>
#include <string>
#include <string_view>

namespace fotomill {

// What a file's first bytes say that it is, whatever its name.
struct Signature {
  std::string_view name;        // as people call the format: "AVIF"
  std::string_view extensions;  // rows of the registry that mean such files: "JPG JPEG"; empty when none does
};

inline constexpr size_t kSignatureBytes = 32;

// Recognises a file by its first kSignatureBytes bytes (fewer when it is shorter). The name is empty when nothing fits.
Signature IdentifySignature(std::span<const uint8_t> head);
// The same for a file; nothing fits when it cannot be opened.
Signature IdentifyFile(const std::string& fileName);

}  // namespace fotomill
