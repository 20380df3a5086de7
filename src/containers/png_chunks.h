#pragma once

#include <cstdint>
#include <span>
#include <string_view>

#include "core/byte_reader.h"

namespace fotomill {

// One chunk of a PNG file: length (4 bytes), type (4), data, CRC (4), all big-endian.
struct PngChunk {
  std::string_view type;
  std::span<const uint8_t> data;
};

// Walks the chunks of a file from its signature to IEND or to where it is cut short.
class PngChunks {
 public:
  explicit PngChunks(std::span<const uint8_t> file) : bytes_(file) { valid_ = bytes_.Match("\x89PNG\r\n\x1a\n"); }
  // Whether the file is a PNG at all.
  bool HasSignature() const { return valid_; }
  // The next chunk; false at the end. CRCs are not checked.
  bool Next(PngChunk& chunk) {
    if (!valid_ || ended_) return false;
    const uint32_t size = bytes_.Be32();
    const auto type = bytes_.Take(4);
    chunk.data = bytes_.Take(size);
    bytes_.Skip(4);
    if (!bytes_.Ok()) return false;
    chunk.type = std::string_view(reinterpret_cast<const char*>(type.data()), 4);
    ended_ = chunk.type == "IEND";
    return true;
  }

 private:
  ByteReader bytes_;
  bool valid_ = false;
  bool ended_ = false;
};

}  // namespace fotomill
