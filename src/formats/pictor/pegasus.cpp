// Pegasus pictures (PIC), and Konica Quality Photos (KQP), little-endian: a bitmap header with a
// JPEG stream that lacks tables.
//
//   offset size  field
//        0    2  "BM"
//       10    4  offset of the data
//       14    4  size of the header that starts here, 68
//       30    4  compression, "JPEG"
//
// The stream has an APP1 segment that starts with "PIC", 0, and three bytes: one unknown, then the
// codes of the luma and chroma quantization tables. A table is that of T.81, K.1, times its code /
// 32. Missing Huffman tables are those of T.81, K.3. Streams with all tables, and those without a
// bitmap header, are supported as well.
//
// The vendor's proprietary ELS coding was never documented; such data are recognized by a frame
// type that is not Huffman-coded, or by another compression name. Sources: File Formats Wiki
// (Archive Team), Pegasus PIC, unofficial; ITU-T T.81 (1992).
#include "formats/pictor/pegasus.h"

#include <algorithm>

#include "core/byte_reader.h"
#include "core/limits.h"

namespace fotomill {

namespace {

constexpr uint64_t kBitmapHead = 14, kCompressionAt = 30;
constexpr uint32_t kLastBitmapCompression = 6;  // maximum value in real bitmaps

// T.81, tables K.1 and K.2, in zigzag order.
constexpr uint8_t kQuantizers[2][64] = {
    {16, 11, 12,  14,  12,  10, 16, 14,  13,  14,  18,  17,  16, 19,  24,  40,
     26, 24, 22,  22,  24,  49, 35, 37,  29,  40,  58,  51,  61, 60,  57,  51,
     56, 55, 64,  72,  92,  78, 64, 68,  87,  69,  55,  56,  80, 109, 81,  87,
     95, 98, 103, 104, 103, 62, 77, 113, 121, 112, 100, 120, 92, 101, 103, 99},
    {17, 18, 18, 24, 21, 24, 47, 26, 26, 47, 99, 66, 56, 66, 99, 99, 99, 99, 99, 99, 99, 99,
     99, 99, 99, 99, 99, 99, 99, 99, 99, 99, 99, 99, 99, 99, 99, 99, 99, 99, 99, 99, 99, 99,
     99, 99, 99, 99, 99, 99, 99, 99, 99, 99, 99, 99, 99, 99, 99, 99, 99, 99, 99, 99}};

bool BeginsStream(std::span<const uint8_t> bytes) {
  return bytes.size() >= 3 && bytes[0] == 0xFF && bytes[1] == 0xD8 && bytes[2] == 0xFF;
}

// The stream after a bitmap header: at the offset in the header, else the first one found.
std::span<const uint8_t> StreamBehind(std::span<const uint8_t> file, uint64_t told, uint64_t head) {
  if (told < file.size() && BeginsStream(file.subspan(told))) return file.subspan(told);
  const uint64_t last = std::min<uint64_t>(file.size(), head + limits.garbageBytes);
  for (uint64_t at = head; at < last; ++at) {
    if (BeginsStream(file.subspan(at))) return file.subspan(at);
  }
  return {};
}

Status FindData(std::span<const uint8_t> file, PegasusStream& stream) {
  if (BeginsStream(file)) {
    stream.data = file;
    stream.bare = true;
    return Status::Ok;
  }
  ByteReader bytes(file);
  if (!bytes.Match("BM")) return Status::DamagedFile;
  bytes.Seek(10);
  const uint64_t told = bytes.Le32(), header = bytes.Le32();
  bytes.Seek(kCompressionAt);
  const bool jpeg = bytes.Match("JPEG");
  const uint32_t compression = jpeg ? 0 : bytes.Le32();
  if (!bytes.Ok()) return Status::FileReadError;
  if (!jpeg)
    return compression <= kLastBitmapCompression ? Status::DamagedFile : Status::UnsupportedFormat;
  stream.data = StreamBehind(file, told, std::min<uint64_t>(kBitmapHead + header, file.size()));
  return stream.data.empty() ? Status::DamagedFile : Status::Ok;
}

void MakeTables(PegasusStream& stream) {
  uint8_t* out = stream.tables.data();
  const auto put = [&](uint32_t byte) { *out++ = static_cast<uint8_t>(byte); };
  for (const uint32_t byte : {0xFF, 0xD8}) put(byte);
  for (uint32_t table = 0; table < 2; ++table) {
    for (const uint32_t byte : {0xFF, 0xDB, 0, 67}) put(byte);
    put(table);
    const uint32_t code = table == 0 ? stream.lumaCode : stream.chromaCode;
    for (const uint8_t step : kQuantizers[table])
      put(std::clamp<uint32_t>((step * code + 16) / 32, 1, 255));
  }
  stream.hasTables = true;
  put(0xFF);
  put(0xD9);
}

}  // namespace

Status FindPegasusStream(std::span<const uint8_t> file, PegasusStream& stream) {
  RETURN_IF_BAD(FindData(file, stream));
  ByteReader bytes(stream.data);
  bytes.Skip(2);
  while (bytes.Ok()) {
    const uint8_t begin = bytes.U8();
    uint8_t marker = bytes.U8();
    while (marker == 0xFF) marker = bytes.U8();
    if (begin != 0xFF || marker == 0xDA || marker == 0xD9) break;
    const bool frame =
        marker >= 0xC0 && marker <= 0xCF && marker != 0xC4 && marker != 0xC8 && marker != 0xCC;
    if (frame && marker > 0xC2) return Status::UnsupportedFormat;
    const uint16_t length = bytes.Be16();
    ByteReader segment(bytes.Take(length < 2 ? 0u : length - 2u));
    if (marker != 0xE1 || !segment.Match({"PIC\0", 4})) continue;
    segment.Skip(1);
    const uint8_t luma = segment.U8(), chroma = segment.U8();
    if (!segment.Ok() || stream.hasTables) continue;
    stream.lumaCode = luma;
    stream.chromaCode = chroma;
    MakeTables(stream);
  }
  return Status::Ok;
}

}  // namespace fotomill
