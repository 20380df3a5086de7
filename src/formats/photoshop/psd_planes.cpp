#include "formats/photoshop/psd_planes.h"

#include <zlib.h>

#include <algorithm>

#include "core/byte_reader.h"
#include "core/checked.h"
#include "core/limits.h"
#include "core/pack_bits.h"

namespace fotomill {

namespace {

constexpr uint16_t kPlain = 0, kPackBits = 1, kDeflate = 2, kDeflateDifferences = 3;
constexpr uint64_t kBestRatio = 1040;  // maximum deflate compression

uint16_t Be16At(std::span<const uint8_t> bytes, size_t index) {
  return static_cast<uint16_t>(bytes[2 * index] << 8 | bytes[2 * index + 1]);
}

// Undoes the delta coding of a row.
void SumRow(std::span<uint8_t> row, bool wide) {
  if (!wide) {
    for (size_t x = 1; x < row.size(); ++x) row[x] = static_cast<uint8_t>(row[x] + row[x - 1]);
    return;
  }
  for (size_t x = 1; x < row.size() / 2; ++x) {
    const auto sum = static_cast<uint16_t>(Be16At(row, x) + Be16At(row, x - 1));
    row[2 * x] = static_cast<uint8_t>(sum >> 8);
    row[2 * x + 1] = static_cast<uint8_t>(sum);
  }
}

}  // namespace

void NarrowPsdSamples(std::span<const uint8_t> wide, std::span<uint8_t> narrow) {
  const uint8_t* from = wide.data();
  for (size_t x = 0; x < narrow.size(); ++x, from += 2) {
    narrow[x] =
        static_cast<uint8_t>((static_cast<uint32_t>(from[0] << 8 | from[1]) * 255 + 32895) >> 16);
  }
}

Status PsdPlane::Next(std::span<uint8_t> row) {
  if (wide_) unpacked_.resize(2 * row.size());
  const std::span<uint8_t> target = wide_ ? std::span(unpacked_) : row;
  size_t size = target.size();
  if (packed_) {
    size = Be16At(sizes_, 0);
    sizes_ = sizes_.subspan(2);
  }
  if (size > data_.size()) return Status::FileReadError;
  auto code = data_.first(size);
  data_ = data_.subspan(size);
  if (packed_ && !UnpackBits(code, target)) return Status::DamagedFile;
  if (wide_) {
    NarrowPsdSamples(packed_ ? std::span<const uint8_t>(unpacked_) : code, row);
  } else if (!packed_) {
    std::ranges::copy(code, row.begin());
  }
  return Status::Ok;
}

Status PsdPlanes::OpenPacked(std::span<const uint8_t> data, size_t height) {
  const size_t sizes = 2 * height * planes_.size();
  if (data.size() < sizes) return Status::FileReadError;
  std::span<const uint8_t> rows = data.subspan(sizes);
  for (size_t c = 0; c < planes_.size(); ++c) {
    PsdPlane& plane = planes_[c];
    plane.packed_ = true;
    plane.sizes_ = data.subspan(2 * height * c, 2 * height);
    plane.data_ = rows;
    uint64_t size = 0;
    for (size_t y = 0; y < height; ++y) size += Be16At(plane.sizes_, y);
    rows = rows.subspan(std::min<uint64_t>(size, rows.size()));
  }
  return Status::Ok;
}

Status PsdPlanes::Inflate(std::span<const uint8_t> data, const PsdHeader& header, size_t rowSize,
                          size_t rows, bool differences) {
  const uint64_t size = uint64_t{rowSize} * rows;
  if (size / kBestRatio > data.size()) return Status::FileReadError;
  if (size > limits.packedBlockBytes || !inflated_.Allocate(size))
    return Status::MemoryAllocationError;
  uLongf filled = size;
  const int result = uncompress(inflated_.Data(), &filled, data.data(), data.size());
  if (filled < size) return result == Z_BUF_ERROR ? Status::FileReadError : Status::DamagedFile;
  if (!differences) return Status::Ok;
  for (size_t y = 0; y < rows; ++y)
    SumRow(inflated_.Bytes().subspan(y * rowSize, rowSize), header.depth == 16);
  return Status::Ok;
}

Status PsdPlanes::Open(std::span<const uint8_t> data, const PsdHeader& header, int32_t width,
                       int32_t height, size_t channels) {
  ByteReader bytes(data);
  const uint16_t compression = bytes.Be16();
  if (!bytes.Ok()) return Status::FileReadError;
  const auto rows = static_cast<size_t>(height);
  const size_t rowSize = header.RowSize(static_cast<size_t>(width));
  planes_.resize(channels);
  for (PsdPlane& plane : planes_) plane.wide_ = header.depth == 16;
  data = data.subspan(2);
  if (compression == kPackBits) return OpenPacked(data, rows);
  if (compression == kDeflate || compression == kDeflateDifferences) {
    RETURN_IF_BAD(Inflate(data, header, rowSize, rows * channels, compression == kDeflateDifferences));
    data = inflated_.Bytes();
  } else if (compression != kPlain) {
    return Status::UnsupportedFormat;
  }
  if (data.size() / channels / rows < rowSize) return Status::FileReadError;
  for (size_t c = 0; c < channels; ++c)
    planes_[c].data_ = data.subspan(c * rows * rowSize, rows * rowSize);
  return Status::Ok;
}

}  // namespace fotomill
