// Pictor pictures (PIC), little-endian.
//
//   offset size  field
//        0    2  magic number 0x1234
//        2    4  width, height
//        6    4  left and lower edge on the screen
//       10    1  bits per pixel and plane; upper 4 bits: planes minus one
//       11    1  FF; the oldest files have none of the following
//       12    1  screen mode, a letter, or a digit for text
//       13    2  palette type: 0 none, 1 CGA, 2 PCjr, 3 EGA, 4 VGA
//       15    2  size of the palette
//       17       palette: CGA: one of six palettes; PCjr: an index of 0 to 15 for each of 16
//                colors; EGA: an index of 0 to 63; VGA: red, green and blue from 0 to 63 each
//        .    2  number of blocks; 0: uncompressed data
//        .       data: the rows of the first plane, bottom row first, then those of the next
//
// Each row of a plane is padded to whole bytes, the leftmost pixel in the highest bits; the first
// plane has the lowest bit of all pixels. Blocks are described in pictor_runs.cpp.
//
// The reader supports one plane of 1, 2, 4 or 8 bits and up to four of 1 bit, but not text screens
// and 24-bit pictures. The writer stores pictures of up to 8 bits with a VGA palette, so colors
// have 6 bits: black and white, 16 colors in four planes, or 256. Some readers do not expect
// padding at the end of rows, so pictures that would need any are stored in 256 colors. Source: J.
// Bridges, "Pictor/PC Paint Format" (1988), in Murray and vanRyper, Encyclopedia of Graphics File
// Formats (1996).
#include "formats/pictor/pictor.h"

#include <algorithm>
#include <array>
#include <cstring>

#include "core/byte_reader.h"
#include "core/byte_writer.h"
#include "formats/pictor/pictor_runs.h"

namespace fotomill {

namespace {

constexpr uint16_t kMagic = 0x1234;
constexpr uint64_t kOldHeader = 11;
constexpr uint8_t kNewMark = 0xFF;
enum PaletteKind : uint16_t {
  kNoPalette = 0,
  kCga = 1,
  kPcjr = 2,
  kEga = 3,
  kVga = 4,
  kVgaToo = 5
};

struct PictorHeader {
  int32_t width = 0, height = 0;
  int32_t left = 0, bottom = 0;
  int32_t bits = 1, planes = 1;
  uint8_t mode = 0;
  uint16_t paletteKind = kNoPalette;
  std::span<const uint8_t> palette = {};
  uint16_t blocks = 0;
  std::span<const uint8_t> data = {};

  int32_t Depth() const { return bits * planes; }
  size_t RowBytes() const {
    return (static_cast<size_t>(width) * static_cast<size_t>(bits) + 7) / 8;
  }
};

Status ParseHeader(std::span<const uint8_t> file, PictorHeader& header) {
  ByteReader bytes(file);
  bytes.Skip(2);
  header.width = bytes.Le16();
  header.height = bytes.Le16();
  header.left = bytes.Le16();
  header.bottom = bytes.Le16();
  const uint8_t depth = bytes.U8();
  header.bits = depth & 15;
  header.planes = (depth >> 4) + 1;
  if (const auto mark = bytes.Peek(1); !mark.empty() && mark[0] == kNewMark) {
    bytes.Skip(1);
    header.mode = bytes.U8();
    header.paletteKind = bytes.Le16();
    const uint16_t length = bytes.Le16();
    header.palette = bytes.Take(length);
  } else {
    bytes.Seek(kOldHeader);
  }
  header.blocks = bytes.Le16();
  if (!bytes.Ok()) return Status::FileReadError;
  header.data = bytes.Take(bytes.Left());
  if (header.width == 0 || header.height == 0 || header.bits == 0) return Status::DamagedFile;
  const bool onePlane = header.planes == 1 && (header.bits == 1 || header.bits == 2 ||
                                               header.bits == 4 || header.bits == 8);
  const bool fewPlanes = header.planes <= 4 && header.bits == 1;
  const bool text = header.mode >= '0' && header.mode <= '9';
  return (onePlane || fewPlanes) && !text ? Status::Ok : Status::UnsupportedFormat;
}

void SetColor(Palette& palette, size_t index, uint32_t rgb) {
  for (size_t i = 0; i < 3; ++i) palette[3 * index + i] = static_cast<uint8_t>(rgb >> (16 - 8 * i));
}

// The low bits of red, green and blue count two thirds, the high ones one third.
uint32_t EgaColor(uint32_t value) {
  const auto part = [&](int low) {
    return (value >> low & 1) * 0xAA + (value >> (low + 3) & 1) * 0x55;
  };
  return part(2) << 16 | part(1) << 8 | part(0);
}

// The CGA colors, with brown for dark yellow.
uint32_t CgaColor(uint32_t index) {
  return index == 6 ? 0xAA5500 : EgaColor((index & 7) | ((index & 8) != 0 ? 0x38 : 0));
}

constexpr uint8_t kCgaSets[6][4] = {{0, 3, 5, 7},    {0, 2, 4, 6},    {0, 3, 4, 7},
                                    {0, 11, 13, 15}, {0, 10, 12, 14}, {0, 11, 12, 15}};

Palette DefaultPalette(int32_t depth) {
  Palette palette = {};
  if (depth > 4) return GrayRamp();
  if (depth == 1) {
    SetColor(palette, 1, 0xFFFFFF);
  } else if (depth == 2) {
    for (size_t i = 0; i < 4; ++i) SetColor(palette, i, CgaColor(kCgaSets[0][i]));
  } else {
    for (uint32_t i = 0; i < 16; ++i) SetColor(palette, i, CgaColor(i));
  }
  return palette;
}

Palette ReadPalette(const PictorHeader& header) {
  Palette palette = DefaultPalette(header.Depth());
  const auto stored = header.palette;
  const size_t most = size_t{1} << header.Depth();
  if (header.paletteKind == kCga && header.Depth() == 2 && !stored.empty() && stored[0] < 6) {
    for (size_t i = 0; i < 4; ++i) SetColor(palette, i, CgaColor(kCgaSets[stored[0]][i]));
  } else if (header.paletteKind == kPcjr) {
    for (size_t i = 0; i < std::min(most, stored.size()); ++i)
      SetColor(palette, i, CgaColor(stored[i] & 15u));
  } else if (header.paletteKind == kEga) {
    for (size_t i = 0; i < std::min(most, stored.size()); ++i)
      SetColor(palette, i, EgaColor(stored[i]));
  } else if (header.paletteKind == kVga || header.paletteKind == kVgaToo) {
    for (size_t i = 0; i < std::min(3 * most, stored.size() / 3 * 3); ++i) {
      const uint8_t level = stored[i] & 63;
      palette[i] = static_cast<uint8_t>(level << 2 | level >> 4);
    }
  }
  return palette;
}

// Converts rows of 2-bit pixels to 4-bit pixels.
void WidenRow(std::span<const uint8_t> row, std::span<uint8_t> target) {
  for (size_t x = 0; x < row.size(); ++x) {
    const uint8_t byte = row[x];
    target[2 * x] = static_cast<uint8_t>((byte >> 2 & 0x30) | (byte >> 4 & 3));
    if (2 * x + 1 < target.size())
      target[2 * x + 1] = static_cast<uint8_t>((byte << 2 & 0x30) | (byte & 3));
  }
}

// For each byte of a plane, the four bytes of eight 4-bit pixels with these lowest bits.
constexpr auto kSpread = [] {
  std::array<std::array<uint8_t, 4>, 256> spread = {};
  for (size_t byte = 0; byte < 256; ++byte) {
    for (size_t i = 0; i < 4; ++i)
      spread[byte][i] =
          static_cast<uint8_t>((byte >> (7 - 2 * i) & 1) << 4 | (byte >> (6 - 2 * i) & 1));
  }
  return spread;
}();

// Sets bit `plane` of the pixels in a 4-bit row, which must be padded to 8 pixels.
void AddPlane(std::span<const uint8_t> row, int32_t plane, std::span<uint8_t> target) {
  for (size_t x = 0; x < row.size(); ++x) {
    for (size_t i = 0; i < 4; ++i)
      target[4 * x + i] = static_cast<uint8_t>(target[4 * x + i] | kSpread[row[x]][i] << plane);
  }
}

Status ReadRows(const PictorHeader& header, const PictureRecord& picture, PackedImage& image) {
  PictorData data(header.data, header.blocks);
  std::vector<uint8_t> row(header.RowBytes());
  const bool direct = header.planes == 1 && header.bits != 2;
  for (int32_t i = 0; i < header.planes * header.height; ++i) {
    const auto target = image.StoredRow(i % header.height);
    if (!data.Next(direct ? target.first(row.size()) : std::span<uint8_t>(row)))
      return Status::FileReadError;
    if (header.planes > 1) {
      AddPlane(row, i / header.height, target);
    } else if (!direct) {
      WidenRow(row, target);
    }
    RETURN_IF_BAD(picture.ReportRow(i / header.planes));
  }
  return Status::Ok;
}

void Describe(const PictorHeader& header, PictureRecord& picture) {
  picture.typeName.AssignCut("Pictor");
  picture.width = header.width;
  picture.height = header.height;
  picture.bitsPerPixel = header.Depth();
  picture.imageBytes = EstimateImageBytes(picture.width, picture.height, picture.bitsPerPixel);
  picture.alphaFlags = static_cast<uint8_t>(picture.alphaFlags & ~kHasAlpha);
  picture.palette = ReadPalette(header);
}

// The bit depth to store a picture in: 1, 4 or 8.
int32_t StoredDepth(const PackedImage& image) {
  return image.Bits() == 8 || image.Width() % 8 != 0 ? 8 : image.Bits();
}

void WriteHeader(ByteWriter& out, const PictureRecord& picture, int32_t depth, uint64_t bytes) {
  const PackedImage& image = picture.image;
  out.Le16(kMagic);
  out.Le16(static_cast<uint16_t>(image.Width()));
  out.Le16(static_cast<uint16_t>(image.Height()));
  out.Le16(0);
  out.Le16(0);
  out.U8(depth == 4 ? 0x31 : static_cast<uint8_t>(depth));
  out.U8(kNewMark);
  out.U8(depth == 1 ? 'O' : depth == 4 ? 'M' : 'L');
  out.Le16(kVga);
  const size_t colors = size_t{1} << depth;
  out.Le16(static_cast<uint16_t>(3 * colors));
  for (size_t i = 0; i < 3 * colors; ++i) {
    const bool used = i < 3 * static_cast<size_t>(image.Colors());
    out.U8(used ? static_cast<uint8_t>((picture.palette[i] * 63 + 127) / 255) : uint8_t{0});
  }
  out.Le16(static_cast<uint16_t>((bytes + kPictorBlock - 1) / kPictorBlock));
}

// Extracts one plane of a 4-bit row.
void TakePlane(std::span<const uint8_t> row, int32_t plane, std::span<uint8_t> target) {
  for (size_t x = 0; x < target.size(); ++x) {
    uint32_t byte = 0;
    for (size_t i = 0; i < 4; ++i) {
      const uint32_t two = row[4 * x + i] >> plane;
      byte = byte << 2 | (two >> 4 & 1) << 1 | (two & 1);
    }
    target[x] = static_cast<uint8_t>(byte);
  }
}

// Unpacks a row of less than 8 bits to one byte per pixel.
void WidenToBytes(std::span<const uint8_t> row, size_t bits, std::span<uint8_t> target) {
  const size_t perByte = 8 / bits;
  for (size_t x = 0; x < target.size(); ++x) {
    const size_t shift = (perByte - 1 - x % perByte) * bits;
    target[x] = static_cast<uint8_t>(row[x / perByte] >> shift & ((1u << bits) - 1));
  }
}

Status WriteRows(ByteWriter& out, const PictureRecord& picture, int32_t depth) {
  const PackedImage& image = picture.image;
  const int32_t height = image.Height(), planes = depth == 4 ? 4 : 1;
  const auto width = static_cast<size_t>(image.Width());
  std::vector<uint8_t> row(depth == 8 ? width : (width + 7) / 8), pending, code;
  for (int32_t i = 0; i < planes * height; ++i) {
    const auto source = image.StoredRow(i % height);
    if (depth == 4) {
      TakePlane(source, i / height, row);
    } else if (depth == image.Bits()) {
      std::copy_n(source.begin(), row.size(), row.begin());
    } else {
      WidenToBytes(source, static_cast<size_t>(image.Bits()), row);
    }
    pending.insert(pending.end(), row.begin(), row.end());
    size_t done = 0;
    for (; pending.size() - done >= kPictorBlock; done += kPictorBlock)
      AppendPictorBlock(std::span(pending).subspan(done, kPictorBlock), code);
    pending.erase(pending.begin(), pending.begin() + static_cast<ptrdiff_t>(done));
    out.Bytes(code);
    code.clear();
    RETURN_IF_BAD(picture.ReportRow(i / planes, height));
  }
  if (!pending.empty()) AppendPictorBlock(pending, code);
  out.Bytes(code);
  return Status::Ok;
}

}  // namespace

bool IsPictor(std::span<const uint8_t> file) { return ByteReader(file).Le16() == kMagic; }

Status PictorInfo(PictureRecord& picture, std::span<const uint8_t> file) {
  PictorHeader header;
  RETURN_IF_BAD(ParseHeader(file, header));
  Describe(header, picture);
  return Status::Ok;
}

Status PictorRead(PictureRecord& picture, std::span<const uint8_t> file, PackedImage& image) {
  PictorHeader header;
  RETURN_IF_BAD(ParseHeader(file, header));
  Describe(header, picture);
  const uint64_t bytes = header.RowBytes() * static_cast<uint64_t>(header.height) *
                         static_cast<uint64_t>(header.planes);
  if (header.blocks == 0 && header.data.size() < bytes) return Status::FileReadError;
  RETURN_IF_BAD(
      NewPackedImage(header.width, header.height, &picture.palette, header.Depth(), image));
  return ReadRows(header, picture, image);
}

Status PictorDetails(DetailLines& lines, std::span<const uint8_t> file) {
  PictorHeader header;
  RETURN_IF_BAD(ParseHeader(file, header));
  constexpr const char* kKinds[] = {"none", "CGA", "PCjr", "EGA", "VGA", "VGA"};
  lines.AddFormat("       Planes: %d of %d bits", header.planes, header.bits);
  if (header.mode >= ' ' && header.mode < 127) lines.AddFormat("  Screen mode: %c", header.mode);
  if (header.paletteKind < std::size(kKinds))
    lines.AddFormat("      Palette: %s", kKinds[header.paletteKind]);
  lines.AddFormat("     Position: %d, %d", header.left, header.bottom);
  lines.AddFormat("       Blocks: %u", unsigned{header.blocks});
  return Status::Ok;
}

Status PictorWrite(PictureRecord& picture, const WriteOptions& options) {
  const ProgressScope progress(picture);
  const PackedImage& image = picture.image;
  if (image.Empty()) return Status::MemoryAllocationError;
  if (image.Bits() > 8) return Status::TooManyColors;
  const int32_t depth = StoredDepth(image);
  const uint64_t bytes = static_cast<uint64_t>(image.Width()) * static_cast<uint64_t>(depth) / 8 *
                         static_cast<uint64_t>(image.Height());
  if (bytes > kPictorBlock * UINT16_MAX) return Status::UnsuitableImage;
  ByteWriter out;
  if (!out.Create(picture.fileName.c_str())) return Status::ErrorCreatingFile;
  WriteHeader(out, picture, depth, bytes);
  RETURN_IF_BAD(WriteRows(out, picture, depth));
  return CommitOutput(out, options);
}

}  // namespace fotomill
