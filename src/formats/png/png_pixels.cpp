#include "formats/png/png_pixels.h"

#include <libdeflate.h>

#include <algorithm>
#include <cstring>
#include <memory>
#include <vector>

#include "containers/png_chunks.h"
#include "core/byte_reader.h"
#include "core/limits.h"
#include "formats/png/png_filter.h"

namespace fotomill {

namespace {

struct DecompressorDeleter {
  void operator()(libdeflate_decompressor* decompressor) const {
    libdeflate_free_decompressor(decompressor);
  }
};

// The data of all pixel chunks, which must be complete and consecutive.
bool FindPixelChunks(std::span<const uint8_t> file, std::vector<std::span<const uint8_t>>& parts,
                     uint64_t& size) {
  PngChunks chunks(file);
  PngChunk chunk;
  while (chunks.Next(chunk)) {
    if (chunk.type != "IDAT") {
      if (!parts.empty()) return true;
      continue;
    }
    const uint8_t* type = chunk.data.data() - 4;
    const uint8_t* crc = chunk.data.data() + chunk.data.size();
    const uint32_t stored = ByteReader({crc, 4}).Be32();
    if (libdeflate_crc32(0, type, chunk.data.size() + 4) != stored) return false;
    parts.push_back(chunk.data);
    size += chunk.data.size();
  }
  return false;
}

// Concatenates the parts; a single part is not copied.
bool Join(const std::vector<std::span<const uint8_t>>& parts, uint64_t size,
          platform::MemoryBlock& copy, std::span<const uint8_t>& joined) {
  joined = parts[0];
  if (parts.size() == 1) return true;
  if (!copy.Allocate(size, platform::Fill::Unset)) return false;
  uint8_t* target = copy.Data();
  for (const auto& part : parts) target = std::copy(part.begin(), part.end(), target);
  joined = copy.Bytes();
  return true;
}

}  // namespace

bool PngPixels::Inflate(std::span<const uint8_t> file, uint64_t rowBytes, uint32_t pixelBits,
                        int32_t height, uint64_t room) {
  rowBytes_ = rowBytes;
  pixelBytes_ = std::max(1u, pixelBits / 8);
  const auto rows = static_cast<uint64_t>(height);
  // part of the memory limit, as the picture and the deflated data are in memory, too
  constexpr uint64_t kShare = 4;
  if (rowBytes == 0 || rowBytes + 1 > limits.packedBlockBytes / kShare / rows) return false;
  const uint64_t size = (rowBytes + 1) * rows;
  std::vector<std::span<const uint8_t>> parts;
  uint64_t packed = 0;
  constexpr uint64_t kBestRatio = 1032;  // maximum deflate compression
  if (!FindPixelChunks(file, parts, packed) || size / kBestRatio > packed) return false;
  if (size + 2 * rowBytes > room || (parts.size() > 1 && packed > room - size - 2 * rowBytes))
    return false;
  platform::MemoryBlock copy;
  std::span<const uint8_t> joined;
  const std::unique_ptr<libdeflate_decompressor, DecompressorDeleter> decompressor(
      libdeflate_alloc_decompressor());
  if (decompressor == nullptr || !Join(parts, packed, copy, joined)) return false;
  if (!filtered_.Allocate(size + kPngSlack, platform::Fill::Unset) ||
      !firstAbove_.Allocate(rowBytes + kPngSlack))
    return false;
  std::memset(filtered_.Data() + size, 0, kPngSlack);
  return libdeflate_zlib_decompress(decompressor.get(), joined.data(), joined.size(),
                                    filtered_.Data(), size, nullptr) == LIBDEFLATE_SUCCESS;
}

const uint8_t* PngPixels::NextRow() {
  uint8_t* row = filtered_.Data() + (rowBytes_ + 1) * static_cast<uint64_t>(next_) + 1;
  const uint8_t* above = next_ == 0 ? firstAbove_.Data() : row - rowBytes_ - 1;
  ++next_;
  return UndoPngFilter(row[-1], row, above, rowBytes_, pixelBytes_) ? row : nullptr;
}

}  // namespace fotomill
