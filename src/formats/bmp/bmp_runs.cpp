#include "formats/bmp/bmp_runs.h"

#include <algorithm>
#include <cstring>

#include "core/byte_reader.h"
#include "formats/split_runs.h"

namespace fotomill {

namespace {

constexpr uint8_t kEndOfLine = 0, kEndOfBitmap = 1, kMove = 2;
constexpr size_t kMostInToken = 255;
constexpr size_t kFewestPlain = 3;  // smaller counts after a 0 are escapes
constexpr size_t kShortestRun = 4;  // shorter runs between literals do not save space

struct Rle8 {
  static constexpr uint64_t kPixelsPerByte = 1;
  static void Run(uint8_t* row, uint64_t x, uint64_t count, uint8_t value) {
    std::memset(row + x, value, count);
  }
  static void Plain(uint8_t* row, uint64_t x, uint64_t count, const uint8_t* data) {
    std::memcpy(row + x, data, count);
  }
};

struct Rle4 {
  static constexpr uint64_t kPixelsPerByte = 2;
  static void Put(uint8_t* row, uint64_t x, uint8_t half) {
    uint8_t& place = row[x / 2];
    place = static_cast<uint8_t>(x % 2 == 0 ? (place & 0x0F) | half << 4 : (place & 0xF0) | half);
  }
  static void Run(uint8_t* row, uint64_t x, uint64_t count, uint8_t value) {
    for (uint64_t i = 0; i < count; ++i) Put(row, x + i, i % 2 == 0 ? value >> 4 : value & 0x0F);
  }
  static void Plain(uint8_t* row, uint64_t x, uint64_t count, const uint8_t* data) {
    for (uint64_t i = 0; i < count; ++i)
      Put(row, x + i, i % 2 == 0 ? data[i / 2] >> 4 : data[i / 2] & 0x0F);
  }
};

template <typename Kind>
Status Decode(platform::FileView& file, const BmpRuns& runs, const PictureRecord& picture,
              PackedImage& image) {
  const auto height = static_cast<uint64_t>(image.Height());
  const uint64_t limit = std::min<uint64_t>(image.Width(), image.Stride() * Kind::kPixelsPerByte);
  ByteReader bytes(file.Bytes());
  bytes.Seek(runs.offset);
  uint64_t x = 0, y = 0;
  // Number of the `count` pixels at (x, y) inside the picture, and the start of the row.
  const auto inside = [&](uint64_t count) {
    return y < height && x < limit ? std::min(count, limit - x) : 0;
  };
  const auto row = [&] {
    return image.StoredRow(static_cast<int32_t>(runs.topDown ? height - 1 - y : y)).data();
  };
  while (bytes.Left() >= 2) {
    const uint8_t count = bytes.U8(), code = bytes.U8();
    if (count > 0) {
      if (const uint64_t visible = inside(count)) Kind::Run(row(), x, visible, code);
      x += count;
    } else if (code == kEndOfLine) {
      x = 0;
      ++y;
      file.DropBefore(bytes.Position());
      RETURN_IF_BAD(picture.ReportRow(static_cast<int32_t>(std::min(y, height))));
    } else if (code == kEndOfBitmap) {
      return file.Intact() ? Status::Ok : Status::FileReadError;
    } else if (code == kMove) {
      x += bytes.U8();
      y += bytes.U8();
    } else {
      const uint64_t size = (code + 2 * Kind::kPixelsPerByte - 1) / (2 * Kind::kPixelsPerByte) * 2;
      const std::span<const uint8_t> data = bytes.Take(size);
      if (!bytes.Ok()) break;
      if (const uint64_t visible = inside(code)) Kind::Plain(row(), x, visible, data.data());
      x += code;
    }
  }
  return Status::FileReadError;
}

void PutRun(size_t count, uint8_t value, ByteWriter& out) {
  uint8_t* const code = out.Reserve(2);
  code[0] = static_cast<uint8_t>(count);
  code[1] = value;
  out.Used(2);
}

void PutPlain(std::span<const uint8_t> pixels, ByteWriter& out) {
  while (pixels.size() >= kFewestPlain) {
    const size_t count = std::min(pixels.size(), kMostInToken);
    uint8_t* const code = out.Reserve(kMostInToken + 3);
    code[0] = 0;
    code[1] = static_cast<uint8_t>(count);
    std::memcpy(code + 2, pixels.data(), count);
    code[2 + count] = 0;
    out.Used(2 + count + count % 2);
    pixels = pixels.subspan(count);
  }
  for (const uint8_t pixel : pixels) PutRun(1, pixel, out);
}

}  // namespace

Status DecodeBmpRuns(platform::FileView& file, const BmpRuns& runs, const PictureRecord& picture,
                     PackedImage& image) {
  return runs.halves ? Decode<Rle4>(file, runs, picture, image)
                     : Decode<Rle8>(file, runs, picture, image);
}

void EncodeRle8Row(std::span<const uint8_t> row, ByteWriter& out) {
  SplitRuns(
      row, kShortestRun, kMostInToken,
      [&](std::span<const uint8_t> pixels) { PutPlain(pixels, out); },
      [&](size_t count, uint8_t value) { PutRun(count, value, out); });
}

}  // namespace fotomill
