#include "plugins/plugin_bitmap.h"

#include <algorithm>
#include <cstring>

#include "core/byte_reader.h"

namespace fotomill {

namespace {

struct BitmapHeader {
  uint32_t size = 0;
  int32_t width = 0;
  int32_t height = 0;
  bool topDown = false;
  uint16_t bits = 0;
  uint32_t compression = 0;
  uint32_t colors = 0;  // entries of the color table
};

Status ParseHeader(ByteReader& bytes, BitmapHeader& header) {
  header.size = bytes.Le32();
  header.width = static_cast<int32_t>(bytes.Le32());
  header.height = static_cast<int32_t>(bytes.Le32());
  bytes.Skip(2);  // planes
  header.bits = bytes.Le16();
  header.compression = bytes.Le32();
  bytes.Skip(12);
  const uint32_t used = bytes.Le32();
  if (!bytes.Ok() || header.size < PackedImage::kHeaderSize) return Status::DamagedFile;
  if (header.compression != 0) return Status::UnsupportedFormat;
  if (header.height < 0 && header.height != INT32_MIN) {
    header.topDown = true;
    header.height = -header.height;
  }
  if (header.width < 1 || header.height < 1) return Status::DamagedFile;
  if (header.bits == 1 || header.bits == 4 || header.bits == 8) {
    const uint32_t most = 1u << header.bits;
    header.colors = used == 0 ? most : used;
    if (header.colors > most) return Status::DamagedFile;
    return Status::Ok;
  }
  return header.bits == 24 || header.bits == 32 ? Status::Ok : Status::UnsupportedFormat;
}

void SplitAlphaRow(std::span<const uint8_t> source, std::span<uint8_t> pixels,
                   std::span<uint8_t> alpha, int32_t width) {
  for (size_t x = 0; x < static_cast<size_t>(width); ++x) {
    std::memcpy(&pixels[3 * x], &source[4 * x], 3);
    alpha[x] = source[4 * x + 3];
  }
}

}  // namespace

Status TakeModuleBitmap(std::span<const uint8_t> block, PackedImage& image, PackedImage& alpha,
                        Palette& palette) {
  ByteReader bytes(block);
  BitmapHeader header;
  RETURN_IF_BAD(ParseHeader(bytes, header));
  bytes.Seek(header.size);
  const auto table = bytes.Take(uint64_t{4} * header.colors);
  const uint64_t stride = RowStride(header.width, header.bits);
  if (!bytes.Ok() || bytes.Left() / stride < static_cast<uint64_t>(header.height))
    return Status::DamagedFile;

  palette.fill(0);
  for (size_t i = 0; i < header.colors; ++i) {
    palette[3 * i] = table[4 * i + 2];
    palette[3 * i + 1] = table[4 * i + 1];
    palette[3 * i + 2] = table[4 * i];
  }
  PackedImage made, plane;
  RETURN_IF_BAD(NewPackedImage(header.width, header.height, &palette, header.bits, made));
  if (header.bits == 32) RETURN_IF_BAD(NewAlphaPlane(header.width, header.height, plane));
  for (int32_t y = 0; y < header.height; ++y) {
    const auto source = bytes.Take(stride);
    const int32_t stored = header.topDown ? header.height - 1 - y : y;
    if (header.bits == 32) {
      SplitAlphaRow(source, made.StoredRow(stored), plane.StoredRow(stored), header.width);
    } else {
      std::copy(source.begin(), source.end(), made.StoredRow(stored).begin());
    }
  }
  image = std::move(made);
  alpha = std::move(plane);
  return Status::Ok;
}

uint64_t LargestModuleBitmap(int32_t width, int32_t height) {
  constexpr uint64_t kMostColors = 256, kLargestHeader = 256;
  return kLargestHeader + 4 * kMostColors + RowStride(width, 32) * static_cast<uint64_t>(height);
}

uint64_t ModuleBitmapSize(const PackedImage& image, const PackedImage& alpha) {
  if (alpha.Empty() || image.Bits() != 24) return image.Bytes().size();
  return PackedImage::kHeaderSize +
         4 * static_cast<uint64_t>(image.Width()) * static_cast<uint64_t>(image.Height());
}

void PutModuleBitmap(const PackedImage& image, const PackedImage& alpha, std::span<uint8_t> block) {
  if (alpha.Empty() || image.Bits() != 24) {
    std::ranges::copy(image.Bytes(), block.begin());
    return;
  }
  std::copy_n(image.Bytes().begin(), PackedImage::kHeaderSize, block.begin());
  block[14] = 32;
  const auto rowBytes = static_cast<uint32_t>(block.size() - PackedImage::kHeaderSize);
  for (size_t i = 0; i < 4; ++i) block[20 + i] = static_cast<uint8_t>(rowBytes >> (8 * i));
  uint8_t* pixel = block.data() + PackedImage::kHeaderSize;
  for (int32_t r = 0; r < image.Height(); ++r) {
    const auto colors = image.StoredRow(r), values = alpha.StoredRow(r);
    for (size_t x = 0; x < static_cast<size_t>(image.Width()); ++x, pixel += 4) {
      std::memcpy(pixel, &colors[3 * x], 3);
      pixel[3] = values[x];
    }
  }
}

}  // namespace fotomill
