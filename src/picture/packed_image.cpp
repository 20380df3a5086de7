#include "picture/packed_image.h"

#include <cstring>

#include "core/checked.h"
#include "core/limits.h"

namespace fotomill {

namespace {

void StoreLe32(uint8_t* bytes, uint32_t value) {
  for (int i = 0; i < 4; ++i) bytes[i] = static_cast<uint8_t>(value >> (8 * i));
}

}  // namespace

int32_t PackedImage::PixelAt(int32_t x, int32_t y) const {
  if (x < 0 || y < 0 || x >= width_ || y >= height_) return -1;
  const uint8_t* row = Row(y).data();
  switch (bits_) {
    case 1: return row[x / 8] >> (7 - x % 8) & 1;
    case 4: return row[x / 2] >> (x % 2 == 0 ? 4 : 0) & 15;
    case 8: return row[x];
    default: {
      const uint8_t* pixel = row + 3 * static_cast<size_t>(x);
      return pixel[2] << 16 | pixel[1] << 8 | pixel[0];
    }
  }
}

Status CheckPackedSize(int32_t width, int32_t height, int32_t bitsPerPixel) {
  if (width < 1 || height < 1) return Status::DamagedFile;
  const int32_t bits = NormalizedDepth(bitsPerPixel);
  // cannot overflow 64 bits: a stride is below 2^34
  const uint64_t rowBytes = RowStride(width, bits) * static_cast<uint64_t>(height);
  const uint64_t headBytes = PackedImage::kHeaderSize + (bits == 24 ? 0 : uint64_t{4} << bits);
  const bool fits = rowBytes + headBytes <= limits.packedBlockBytes && rowBytes <= UINT32_MAX;
  return fits ? Status::Ok : Status::MemoryAllocationError;
}

Status CheckFileMemory(uint64_t bytes) {
  return bytes <= limits.fileMemoryBytes ? Status::Ok : Status::MemoryAllocationError;
}

Status NewPackedImage(int32_t width, int32_t height, const Palette* palette, int32_t bitsPerPixel,
                      PackedImage& image, platform::Fill fill) {
  image.Free();
  RETURN_IF_BAD(CheckPackedSize(width, height, bitsPerPixel));
  PackedImage made;
  made.width_ = width;
  made.height_ = height;
  made.bits_ = NormalizedDepth(bitsPerPixel);
  made.stride_ = RowStride(width, made.bits_);
  const uint64_t rowBytes = made.stride_ * static_cast<uint64_t>(height);
  const uint64_t size = made.RowsOffset() + rowBytes;
  if (!made.block_.Allocate(size, fill)) return Status::MemoryAllocationError;

  uint8_t* header = made.block_.Data();
  std::memset(header, 0, made.RowsOffset());
  StoreLe32(header, PackedImage::kHeaderSize);
  StoreLe32(header + 4, static_cast<uint32_t>(width));
  StoreLe32(header + 8, static_cast<uint32_t>(height));
  header[12] = 1;
  header[14] = static_cast<uint8_t>(made.bits_);
  StoreLe32(header + 20, static_cast<uint32_t>(rowBytes));
  StoreLe32(header + 32, static_cast<uint32_t>(made.Colors()));
  StoreLe32(header + 36, static_cast<uint32_t>(made.Colors()));
  for (int32_t i = 0; palette != nullptr && i < made.Colors(); ++i) {
    uint8_t* entry = header + PackedImage::kHeaderSize + 4 * i;
    const uint8_t* color = palette->data() + 3 * i;
    entry[0] = color[2];
    entry[1] = color[1];
    entry[2] = color[0];
  }
  image = std::move(made);
  return Status::Ok;
}

Status NewAlphaPlane(int32_t width, int32_t height, PackedImage& plane, platform::Fill fill) {
  const Palette ramp = GrayRamp();
  return NewPackedImage(width, height, &ramp, 8, plane, fill);
}

}  // namespace fotomill
