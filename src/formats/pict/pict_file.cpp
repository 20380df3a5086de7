// The layout of a Macintosh picture (PICT), big-endian.
//
//   offset size  field
//        0  512  unused; optional
//        0    2  size of the picture, low half
//        2    8  frame: top, left, bottom, right
//       10       version 1: 11 01, opcodes of one byte; version 2: 00 11 02 FF, opcodes of 2 bytes
//                at even offsets
//
// Opcodes with pixels: 90, 91 (with a region) unpacked bits; 98, 99 packed; 9A, 9B without color
// table:
//       9A, 9B: 4  base address, FF
//        2  bytes per row; 0x8000: a pixel map
//        8  bounds
//       36  of a pixel map: version (2), pack type (2), pack size (4), resolutions (8), pixel type
//           (2), bits per pixel (2), components (2), bits per component (2), unused (12)
//        .  of a pixel map with colors: seed (4), flags (2), entries minus one (2), entries of
//           index, red, green, blue (2 each)
//       18  source and target rectangle, mode
//        .  91, 99, 9B: region: size (2, including itself), data
//        .  rows; packed ones are preceded by their size, in 1 byte if an unpacked row has at most
//           250, else in 2
//
// 8200 has a compressed QuickTime picture: size (4), version (2), matrix (36), matte size (4),
// matte (8), mode (2), source (8), accuracy (4), mask size (4), if there is a matte its description
// and data, the mask, then the description of the picture: its size (4), type (4), ..., width at
// 32, height at 34, size of the data at 44, and the data.
//
// Some programs based the width of the row sizes on the packed data, without the fourth component;
// it is read that way if the file is otherwise invalid. All other opcodes are skipped by their
// sizes according to the source. Source: Apple Computer, "Inside Macintosh: Imaging With
// QuickDraw", appendix A (1994), and "QuickTime File Format".
#include "formats/pict/pict_file.h"

#include <algorithm>
#include <string_view>

#include "core/byte_reader.h"

namespace fotomill {

namespace {

constexpr uint64_t kPreamble = 512;
constexpr uint32_t kEnd = 0xff, kVersion = 0x11, kQuickTime = 0x8200;
constexpr uint16_t kIsPixelMap = 0x8000;
constexpr size_t kShortRow = 8, kLongRow = 250;
constexpr size_t kMostPixels = 65536;  // bitmaps per picture

// Size of an opcode's data: a number of bytes, or one of these.
enum Size : int8_t {
  Word = -1,
  Long = -2,
  Region = -3,
  Text = -4,
  Comment = -5,
  Pattern = -6,
  Pixels = -7
};

struct Operations {
  uint32_t first, last;
  int8_t size;          // bytes; with Text, `before` bytes precede the counted text
  bool draws = false;
  int8_t before = 0;
};

// clang-format off
constexpr Operations kOperations[] = {
    {0x00, 0x00, 0}, {0x01, 0x01, Region}, {0x02, 0x02, 8}, {0x03, 0x03, 2}, {0x04, 0x04, 1}, {0x05, 0x05, 2}, {0x06, 0x07, 4},
    {0x08, 0x08, 2}, {0x09, 0x0a, 8}, {0x0b, 0x0c, 4}, {0x0d, 0x0d, 2}, {0x0e, 0x0f, 4}, {0x10, 0x10, 8}, {0x11, 0x11, 2},
    {0x12, 0x14, Pattern}, {0x15, 0x16, 2}, {0x17, 0x19, 0}, {0x1a, 0x1b, 6}, {0x1c, 0x1c, 0}, {0x1d, 0x1d, 6}, {0x1e, 0x1e, 0},
    {0x1f, 0x1f, 6},
    {0x20, 0x20, 8, true}, {0x21, 0x21, 4, true}, {0x22, 0x22, 6, true}, {0x23, 0x23, 2, true}, {0x24, 0x27, Word},
    {0x28, 0x28, Text, true, 4}, {0x29, 0x2a, Text, true, 1}, {0x2b, 0x2b, Text, true, 2}, {0x2c, 0x2f, Word},
    {0x30, 0x34, 8, true}, {0x35, 0x37, 8}, {0x38, 0x3c, 0, true}, {0x3d, 0x3f, 0},
    {0x40, 0x44, 8, true}, {0x45, 0x47, 8}, {0x48, 0x4c, 0, true}, {0x4d, 0x4f, 0},
    {0x50, 0x54, 8, true}, {0x55, 0x57, 8}, {0x58, 0x5c, 0, true}, {0x5d, 0x5f, 0},
    {0x60, 0x64, 12, true}, {0x65, 0x67, 12}, {0x68, 0x6c, 4, true}, {0x6d, 0x6f, 4},
    {0x70, 0x74, Region, true}, {0x75, 0x77, Region}, {0x78, 0x7c, 0, true}, {0x7d, 0x7f, 0},
    {0x80, 0x84, Region, true}, {0x85, 0x87, Region}, {0x88, 0x8c, 0, true}, {0x8d, 0x8f, 0},
    {0x90, 0x91, Pixels}, {0x92, 0x97, Word}, {0x98, 0x9b, Pixels}, {0x9c, 0x9f, Word},
    {0xa0, 0xa0, 2}, {0xa1, 0xa1, Comment}, {0xa2, 0xaf, Word}, {0xb0, 0xcf, 0}, {0xd0, 0xfe, Long},
    {0x8000, 0x80ff, 0}, {0x8100, 0xffff, Long},
};
// clang-format on

const Operations* Find(uint32_t code) {
  const auto fits = [code](const Operations& row) { return row.first <= code && code <= row.last; };
  const auto found = std::ranges::find_if(kOperations, fits);
  return found == std::end(kOperations) ? nullptr : found;
}

Rectangle TakeRectangle(ByteReader& bytes) {
  const auto number = [&] { return int32_t{static_cast<int16_t>(bytes.Be16())}; };
  Rectangle rectangle;
  rectangle.y = number();
  rectangle.x = number();
  rectangle.height = number() - rectangle.y;
  rectangle.width = number() - rectangle.x;
  return rectangle;
}

// Skips a 2-byte size that includes itself, and its data.
void SkipRegion(ByteReader& bytes) {
  const uint16_t size = bytes.Be16();
  bytes.Skip(std::max<uint16_t>(size, 2) - 2u);
}

void TakePixelMap(ByteReader& bytes, PictPixels& pixels) {
  bytes.Skip(2);
  pixels.packType = bytes.Be16();
  bytes.Skip(14);
  pixels.bits = bytes.Be16();
  pixels.parts = bytes.Be16();
  bytes.Skip(14);
}

void TakeColorTable(ByteReader& bytes, PictPixels& pixels) {
  bytes.Skip(4);
  pixels.tableInOrder = (bytes.Be16() & 0x8000) != 0;
  pixels.colorTable = bytes.Take((bytes.Be16() + uint64_t{1}) * 8);
}

// Total size of packed rows and their counts; larger than the data if they are truncated.
uint64_t PackedSize(ByteReader rows, size_t height, bool longCounts) {
  const uint64_t begin = rows.Position(), left = rows.Left();
  for (size_t y = 0; y < height && rows.Ok(); ++y) rows.Skip(longCounts ? rows.Be16() : rows.U8());
  return rows.Ok() ? rows.Position() - begin : left + 1;
}

// Reads the rows according to `pixels`.
void TakeRows(ByteReader& bytes, PictPixels& pixels) {
  const auto height = static_cast<size_t>(std::max(pixels.bounds.height, 0));
  if (!pixels.packed) {
    const size_t size =
        pixels.bits == 32 && pixels.packType == 2 ? pixels.rowBytes / 4 * 3 : pixels.rowBytes;
    pixels.data = bytes.Take(uint64_t{size} * height);
    return;
  }
  pixels.longCounts = pixels.rowBytes > kLongRow;
  uint64_t size = PackedSize(bytes, height, pixels.longCounts);
  if (size > bytes.Left() && pixels.bits == 32 &&
      3 * static_cast<size_t>(pixels.bounds.width) <= kLongRow) {
    pixels.longCounts = false;
    size = PackedSize(bytes, height, false);
  }
  pixels.data = bytes.Take(size);
}

bool IsDecoded(const PictPixels& pixels) {
  if (pixels.bounds.width < 1 || pixels.bounds.height < 1) return false;
  const auto width = static_cast<size_t>(pixels.bounds.width);
  if (pixels.Indexed()) {
    const bool known = pixels.bits == 1 || pixels.bits == 2 || pixels.bits == 4 || pixels.bits == 8;
    return known && pixels.rowBytes * 8 >= width * static_cast<size_t>(pixels.bits);
  }
  if (pixels.packType < 1 || pixels.packType > 4 || pixels.parts < 3 || pixels.parts > 4)
    return false;
  if (pixels.bits == 16)
    return (pixels.packType == 1 || pixels.packType == 3) && pixels.rowBytes >= 2 * width;
  return pixels.bits == 32 && pixels.packType != 3 && pixels.rowBytes >= 4 * width;
}

// Reads the data of an opcode with pixels.
void TakePixels(uint32_t code, ByteReader& bytes, PictFile& pict) {
  PictPixels pixels;
  const bool direct = code >= 0x9a, ofRegion = code % 2 != 0;
  if (direct) bytes.Skip(4);
  const uint16_t rowBytes = bytes.Be16();
  const bool map = direct || (rowBytes & kIsPixelMap) != 0;
  pixels.rowBytes = rowBytes & 0x7fff;
  pixels.bounds = TakeRectangle(bytes);
  if (map) TakePixelMap(bytes, pixels);
  pixels.inverted = !map;
  if (map && !direct) TakeColorTable(bytes, pixels);
  pixels.source = TakeRectangle(bytes);
  pixels.target = TakeRectangle(bytes);
  bytes.Skip(2);
  if (ofRegion) SkipRegion(bytes);
  if (pixels.packType == 0) pixels.packType = pixels.bits == 16 ? 3 : 4;
  if (pixels.rowBytes < kShortRow) pixels.packType = 1;
  pixels.packed = pixels.rowBytes >= kShortRow && code >= 0x98 && (!direct || pixels.packType > 2);
  if (!bytes.Ok()) return;
  TakeRows(bytes, pixels);
  if (!bytes.Ok()) return;
  if (!IsDecoded(pixels)) {
    ++pict.unsupported;
  } else if (pict.pixels.size() < kMostPixels) {
    pict.pixels.push_back(pixels);
  }
}

// A pixel pattern has the same layout as pixels, without source, target and mode.
void SkipPattern(ByteReader& bytes) {
  const uint16_t kind = bytes.Be16();
  bytes.Skip(8);
  if (kind == 2) return bytes.Skip(6);
  if (kind != 1) return;
  PictPixels pixels;
  pixels.rowBytes = bytes.Be16() & 0x7fff;
  pixels.bounds = TakeRectangle(bytes);
  TakePixelMap(bytes, pixels);
  TakeColorTable(bytes, pixels);
  pixels.packed = pixels.rowBytes >= kShortRow;
  if (bytes.Ok()) TakeRows(bytes, pixels);
}

void TakeQuickTime(std::span<const uint8_t> data, PictFile& pict) {
  ByteReader bytes(data);
  bytes.Skip(2 + 24);
  const auto x = static_cast<int16_t>(bytes.Be32() >> 16),
             y = static_cast<int16_t>(bytes.Be32() >> 16);
  bytes.Skip(4);
  const uint32_t matteSize = bytes.Be32();
  bytes.Skip(8 + 2 + 8 + 4);
  const uint32_t maskSize = bytes.Be32();
  if (matteSize > 0) {
    bytes.Skip(std::max<uint32_t>(bytes.Be32(), 4) - 4);
    bytes.Skip(matteSize);
  }
  bytes.Skip(maskSize);
  const uint64_t description = bytes.Position();
  const uint32_t size = bytes.Be32();
  const bool jpeg = bytes.Match("jpeg");
  PictPixels pixels;
  bytes.Seek(description + 32);
  const int32_t width = bytes.Be16(), height = bytes.Be16();
  bytes.Seek(description + size);
  if (!bytes.Ok() || !jpeg || size < 86) {
    ++pict.unsupported;
    return;
  }
  pixels.target = {x, y, width, height};
  pixels.jpeg = true;
  pixels.data = bytes.Take(bytes.Left());
  if (pict.pixels.size() < kMostPixels) pict.pixels.push_back(pixels);
}

// Skips the data of an opcode without pixels.
void SkipData(const Operations& operation, ByteReader& bytes) {
  switch (operation.size) {
    case Word: return bytes.Skip(bytes.Be16());
    case Long: return bytes.Skip(bytes.Be32());
    case Region: return SkipRegion(bytes);
    case Pattern: return SkipPattern(bytes);
    case Text: bytes.Skip(static_cast<uint64_t>(operation.before)); return bytes.Skip(bytes.U8());
    case Comment: bytes.Skip(2); return bytes.Skip(bytes.Be16());
    default: return bytes.Skip(static_cast<uint64_t>(operation.size));
  }
}

// Processes one opcode. False at the end of the picture.
bool TakeOperation(ByteReader& bytes, PictFile& pict) {
  const uint64_t begin = bytes.Position();
  const uint32_t code = pict.version == 1 ? bytes.U8() : bytes.Be16();
  if (!bytes.Ok() || code == kEnd) return false;
  if (code == kQuickTime) {
    TakeQuickTime(bytes.Take(bytes.Be32()), pict);
  } else if (pict.version == 1 && code == kVersion) {
    bytes.Skip(1);
  } else if (const Operations* operation = Find(code); operation == nullptr) {
    bytes.Skip(uint64_t{code >> 8} * 2);
  } else if (operation->size == Pixels) {
    TakePixels(code, bytes, pict);
  } else {
    pict.drawings += operation->draws ? 1 : 0;
    SkipData(*operation, bytes);
  }
  if (pict.version == 2 && (bytes.Position() - begin) % 2 != 0) bytes.Skip(1);
  return bytes.Ok();
}

// The version of a picture that starts at the offset; 0 if there is none.
int32_t VersionAt(std::span<const uint8_t> file, uint64_t offset) {
  ByteReader bytes(file);
  bytes.Seek(offset + 10);
  if (bytes.Match(std::string_view("\0\x11\x02\xff", 4))) return 2;
  return bytes.Ok() && bytes.Match("\x11\x01") ? 1 : 0;
}

}  // namespace

Status ParsePict(std::span<const uint8_t> file, PictFile& pict) {
  uint64_t begin = kPreamble;
  pict.version = VersionAt(file, begin);
  if (pict.version == 0) {
    begin = 0;
    pict.version = VersionAt(file, begin);
  }
  if (pict.version == 0) return file.size() < 14 ? Status::FileReadError : Status::DamagedFile;
  ByteReader bytes(file);
  bytes.Seek(begin + 2);
  pict.frame = TakeRectangle(bytes);
  while (TakeOperation(bytes, pict)) {
  }
  pict.cutShort = !bytes.Ok();
  return Status::Ok;
}

}  // namespace fotomill
