#include "formats/paintshop/psp_planes.h"

#include <zlib.h>

#include <algorithm>
#include <cstring>

#include "core/byte_reader.h"
#include "core/limits.h"

namespace fotomill {

namespace {

constexpr uint64_t kBestDeflate = 1040, kBestRuns = 64;  // maximum compression ratios

// False if the data are truncated.
bool UnpackRuns(std::span<const uint8_t> data, std::span<uint8_t> rows) {
  ByteReader bytes(data);
  size_t filled = 0;
  while (filled < rows.size()) {
    const uint8_t token = bytes.U8();
    const size_t count = token > 128 ? token - 128u : token,
                 room = std::min(count, rows.size() - filled);
    if (token > 128) {
      std::memset(&rows[filled], bytes.U8(), room);
    } else {
      std::ranges::copy(bytes.Take(room), &rows[filled]);
    }
    if (!bytes.Ok()) return false;
    filled += room;
  }
  return true;
}

}  // namespace

Status PspPlane::Unpack(const PspLayer& layer, std::span<const uint8_t> data, uint64_t size) {
  const bool runs = layer.compression == PspCompression::RunLengths;
  if (size / (runs ? kBestRuns : kBestDeflate) > data.size()) return Status::FileReadError;
  if (size > limits.packedBlockBytes || !unpacked_.Allocate(size))
    return Status::MemoryAllocationError;
  if (runs) return UnpackRuns(data, unpacked_.Bytes()) ? Status::Ok : Status::FileReadError;
  uLongf filled = size;
  const int result = uncompress(unpacked_.Data(), &filled, data.data(), data.size());
  if (filled == size) return Status::Ok;
  return result == Z_BUF_ERROR ? Status::FileReadError : Status::DamagedFile;
}

Status PspPlane::Open(const PspLayer& layer, const PspChannel& channel) {
  const auto width = static_cast<uint64_t>(layer.place.width),
             height = static_cast<uint64_t>(layer.place.height);
  const bool colors = channel.bitmap == PspBitmap::Image && channel.color == PspColor::Composite;
  bits_ = layer.bits == 16 || layer.bits == 48 ? 16 : colors ? std::min(layer.bits, 8) : 8;
  const uint64_t least = (width * static_cast<uint64_t>(bits_) + 7) / 8;
  const bool padded = channel.size % height == 0 && channel.size / height > least &&
                      channel.size / height < least + 4;
  rowSize_ = padded ? channel.size / height : least;
  const uint64_t size = rowSize_ * height;
  rows_ = channel.data;
  if (layer.compression == PspCompression::RunLengths ||
      layer.compression == PspCompression::Lz77) {
    RETURN_IF_BAD(Unpack(layer, channel.data, size));
    rows_ = unpacked_.Bytes();
  } else if (layer.compression != PspCompression::None) {
    return Status::UnsupportedFormat;
  }
  return rows_.size() < size ? Status::FileReadError : Status::Ok;
}

void PspPlane::Row(int32_t y, std::span<uint8_t> samples) const {
  const auto row = rows_.subspan(static_cast<size_t>(y) * rowSize_, rowSize_);
  if (bits_ == 8) {
    std::copy_n(row.begin(), samples.size(), samples.begin());
  } else if (bits_ == 16) {
    for (size_t x = 0; x < samples.size(); ++x) {
      const auto wide = static_cast<uint32_t>(row[2 * x + 1] << 8 | row[2 * x]);
      samples[x] = static_cast<uint8_t>((wide * 255 + 32895) >> 16);
    }
  } else {
    const auto bits = static_cast<size_t>(bits_), perByte = 8 / bits;
    for (size_t x = 0; x < samples.size(); ++x) {
      const auto shift = 8 - bits * (x % perByte + 1);
      samples[x] = static_cast<uint8_t>(row[x / perByte] >> shift & ((1u << bits) - 1));
    }
  }
}

}  // namespace fotomill
