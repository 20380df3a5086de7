// PC Paintbrush (PCX), little-endian.
//
//   offset size  field
//        0    1  manufacturer, always 10
//        1    1  version; 3: the fixed 16 colors; from 5 on, 8-bit files may end in a palette;
//                written as 5
//        2    1  encoding, written as 1; ignored: data are always run-length coded
//        3    1  bits per pixel and plane
//        4    8  xmin, ymin, xmax, ymax; written as 0, 0, width - 1, height - 1
//       12    4  two resolutions, written as 300
//       16   48  palette of 16 colors
//       64    1  reserved
//       65    1  planes
//       66    2  bytes per line and plane, used as stored; written without padding
//       68    2  palette information, written as 1, or 0 with 24 bits
//       70   58  filler
//      128       lines, top first, each with its planes one after the other
//   end - 769    12 and a palette of 256 colors, with 8 bits
//
// Palettes are red, green, blue. A byte of 0xC0 or more has the repeat count of the next byte in
// its low six bits; any other byte is a literal.
//
// The reader continues runs across lines, and in addition to the combinations it writes supports
// two bits in one plane (CGA). The writer encodes every plane of every line separately, and leaves
// the last byte of a run to the next token. Source: ZSoft Corporation, "PCX Technical Reference
// Manual" (1991).
#include "formats/pcx/pcx.h"

#include <algorithm>
#include <array>
#include <cstring>

#include "core/byte_reader.h"
#include "core/byte_writer.h"
#include "formats/pcx/pcx_page.h"
#include "formats/pcx/pcx_runs.h"
#include "picture/partial.h"
#include "platform/file_view.h"
#include "processing/pixel_rows.h"

namespace fotomill {

namespace {

constexpr uint64_t kHeaderSize = 128;
constexpr uint8_t kManufacturer = 10;
constexpr uint8_t kVersionFixedColors = 3, kVersionTrailer = 5;
constexpr uint16_t kResolution = 300;
constexpr size_t kHeaderPaletteSize = 48;
constexpr uint8_t kTrailerMark = 12;
constexpr uint64_t kTrailerSize = 1 + 768;

// The palette of version 3 files, which do not store one.
constexpr std::array<uint8_t, kHeaderPaletteSize> kFixedColors = {
    0x00, 0x00, 0x00, 0x00, 0x00, 0xAA, 0x00, 0xAA, 0x00, 0x00, 0xAA, 0xAA, 0xAA, 0x00, 0x00, 0xAA,
    0x00, 0xAA, 0xAA, 0x55, 0x00, 0xAA, 0xAA, 0xAA, 0x55, 0x55, 0x55, 0x55, 0x55, 0xFF, 0x55, 0xFF,
    0x55, 0x55, 0xFF, 0xFF, 0xFF, 0x55, 0x55, 0xFF, 0x55, 0xFF, 0xFF, 0xFF, 0x55, 0xFF, 0xFF, 0xFF};

struct PcxHeader {
  uint8_t version = 0;
  uint8_t bitsPerPlane = 0;
  uint8_t planes = 0;
  int32_t width = 0, height = 0;  // 1 to 65536 if valid
  uint16_t bytesPerLine = 0;      // per plane
  std::array<uint8_t, kHeaderPaletteSize> palette{};

  size_t LineSize() const { return size_t{bytesPerLine} * planes; }
};

// Converts a decoded line of `header.LineSize()` bytes to a row of the picture, including padding.
// Pixels missing in the line become 0.
using SpreadRow = void (*)(std::span<const uint8_t> line, const PcxHeader& header,
                           std::span<uint8_t> row);

void CopyRow(std::span<const uint8_t> line, const PcxHeader&, std::span<uint8_t> row) {
  const size_t count = std::min(line.size(), row.size());
  std::memcpy(row.data(), line.data(), count);
  std::memset(row.data() + count, 0, row.size() - count);
}

// Combines 2 to 4 bit planes to 4-bit pixels, the first plane being the lowest bit.
void SpreadBitPlanes(std::span<const uint8_t> line, const PcxHeader& header,
                     std::span<uint8_t> row) {
  const size_t count = static_cast<size_t>(std::min(header.width, header.bytesPerLine * 8));
  std::memset(row.data(), 0, row.size());
  MergeBitPlanes(line.data(), count, header.planes, header.bytesPerLine, row.data());
}

// Converts 2-bit pixels to 4-bit pixels.
void SpreadPairs(std::span<const uint8_t> line, const PcxHeader& header, std::span<uint8_t> row) {
  std::memset(row.data(), 0, row.size());
  const int32_t width = std::min(header.width, header.bytesPerLine * 4);
  for (int32_t x = 0; x < width; ++x) {
    const int32_t index = line[static_cast<size_t>(x / 4)] >> (6 - x % 4 * 2) & 3;
    row[static_cast<size_t>(x / 2)] |= static_cast<uint8_t>(x % 2 == 0 ? index << 4 : index);
  }
}

// Combines red, green and blue planes to pixels of blue, green, red.
void MergeColorPlanes(std::span<const uint8_t> line, const PcxHeader& header,
                      std::span<uint8_t> row) {
  const size_t count = std::min<size_t>(header.width, header.bytesPerLine);
  const uint8_t* red = line.data();
  const uint8_t* green = red + header.bytesPerLine;
  const uint8_t* blue = green + header.bytesPerLine;
  MergeColors(blue, green, red, count, row.data());
  std::memset(row.data() + 3 * count, 0, row.size() - 3 * count);
}

// The supported plane arrangements, and the resulting depth.
struct Arrangement {
  uint8_t bitsPerPlane;
  uint8_t planes;
  int32_t depth;
  SpreadRow spread;
};
// clang-format off
constexpr Arrangement kArrangements[] = {
    //bits planes depth spread
    {1,    1,     1,    CopyRow},
    {1,    2,     2,    SpreadBitPlanes},
    {1,    3,     3,    SpreadBitPlanes},
    {1,    4,     4,    SpreadBitPlanes},
    {2,    1,     2,    SpreadPairs},
    {4,    1,     4,    CopyRow},
    {8,    1,     8,    CopyRow},
    {8,    3,     24,   MergeColorPlanes},
};
// clang-format on

// Null for unsupported combinations.
const Arrangement* FindArrangement(const PcxHeader& header) {
  for (const Arrangement& row : kArrangements) {
    if (row.bitsPerPlane == header.bitsPerPlane && row.planes == header.planes) return &row;
  }
  return nullptr;
}

// Ok, or DamagedFile if the header is truncated, of another format, or describes no valid picture.
Status ParseHeader(std::span<const uint8_t> file, PcxHeader& header) {
  ByteReader bytes(file);
  const uint8_t manufacturer = bytes.U8();
  header.version = bytes.U8();
  bytes.Skip(1);  // encoding
  header.bitsPerPlane = bytes.U8();
  const uint16_t xMin = bytes.Le16(), yMin = bytes.Le16();
  header.width = bytes.Le16() - xMin + 1;
  header.height = bytes.Le16() - yMin + 1;
  bytes.Skip(4);  // resolutions
  const std::span<const uint8_t> palette = bytes.Take(kHeaderPaletteSize);
  std::copy(palette.begin(), palette.end(), header.palette.begin());
  bytes.Skip(1);
  header.planes = bytes.U8();
  header.bytesPerLine = bytes.Le16();
  bytes.Seek(kHeaderSize);
  const bool sizesValid = header.width > 0 && header.height > 0 && header.bytesPerLine > 0;
  const bool valid = bytes.Ok() && manufacturer == kManufacturer && sizesValid &&
                     FindArrangement(header) != nullptr;
  return valid ? Status::Ok : Status::DamagedFile;
}

// Sets `palette` according to version and depth in the header. FileReadError if a palette at the
// end exists but cannot be read.
Status ReadPalette(const platform::FileView& file, const PcxPlace& place, const PcxHeader& header,
                   int32_t depth, Palette& palette) {
  MakeDefaultPalette(&palette, nullptr, depth == 24 ? kDisplayPalette : kBlackAndWhitePalette);
  if (depth == 1 || depth == 24) return Status::Ok;
  if (depth == 8 && header.version >= kVersionTrailer && place.Size() >= kTrailerSize) {
    std::array<uint8_t, kTrailerSize> trailer;
    if (!file.ReadAt(place.end - kTrailerSize, trailer)) return Status::FileReadError;
    if (trailer[0] == kTrailerMark) {
      std::copy(trailer.begin() + 1, trailer.end(), palette.begin());
      return Status::Ok;
    }
  }
  const auto& colors = header.version == kVersionFixedColors ? kFixedColors : header.palette;
  std::copy(colors.begin(), colors.end(), palette.begin());
  return Status::Ok;
}

// Parses the header and fills in the record.
Status DescribePicture(const platform::FileView& file, const PcxPlace& place,
                       PictureRecord& picture, PcxHeader& header) {
  picture.typeName.Clear();
  picture.fileSize = file.FileSize();
  std::array<uint8_t, kHeaderSize> bytes;
  const auto head =
      std::span(bytes).first(static_cast<size_t>(std::min(place.Size(), kHeaderSize)));
  if (!file.ReadAt(place.begin, head)) return Status::FileReadError;
  RETURN_IF_BAD(ParseHeader(head, header));
  picture.width = header.width;
  picture.height = header.height;
  picture.bitsPerPixel = FindArrangement(header)->depth;
  picture.imageBytes = (picture.bitsPerPixel == 24 ? header.LineSize() : header.bytesPerLine) *
                       uint64_t(header.height);
  picture.alphaFlags = static_cast<uint8_t>(picture.alphaFlags & ~kHasAlpha);
  return ReadPalette(file, place, header, picture.bitsPerPixel, picture.palette);
}

// File layout for a picture to write.
struct PcxLayout {
  int32_t depth = 0;  // 1, 2, 3, 4, 8 or 24
  uint8_t bitsPerPlane = 0;
  uint8_t planes = 0;
  uint16_t bytesPerLine = 0;  // per plane
};

// UnsuitableImage if a line does not fit its field.
Status ChooseLayout(const PictureRecord& picture, PcxLayout& layout) {
  const PackedImage& image = picture.image;
  const bool planar = image.Bits() == 4 && picture.bitsPerPixel >= 2 && picture.bitsPerPixel <= 4;
  layout.depth = planar ? picture.bitsPerPixel : image.Bits();
  layout.bitsPerPlane = layout.depth <= 4 ? 1 : 8;
  layout.planes = static_cast<uint8_t>(layout.depth == 24  ? 3
                                       : layout.depth <= 4 ? layout.depth
                                                           : 1);
  const int32_t bytesPerLine = layout.depth <= 4 ? (image.Width() + 7) / 8 : image.Width();
  if (bytesPerLine > UINT16_MAX) return Status::UnsuitableImage;
  layout.bytesPerLine = static_cast<uint16_t>(bytesPerLine);
  return Status::Ok;
}

void WriteHeader(ByteWriter& out, const PcxLayout& layout, const PictureRecord& picture) {
  out.U8(kManufacturer);
  out.U8(kVersionTrailer);
  out.U8(1);
  out.U8(layout.bitsPerPlane);
  out.Zeros(4);
  out.Le16(static_cast<uint16_t>(picture.image.Width() - 1));
  out.Le16(static_cast<uint16_t>(picture.image.Height() - 1));
  out.Le16(kResolution);
  out.Le16(kResolution);
  out.Bytes(std::span(picture.palette).first(kHeaderPaletteSize));
  out.U8(0);
  out.U8(layout.planes);
  out.Le16(layout.bytesPerLine);
  out.Le16(layout.depth == 24 ? 0 : 1);
  out.Zeros(kHeaderSize - 70);
}

// Splits a row into planes of `bytesPerLine` bytes each, one after the other.
using TakePlanes = void (*)(std::span<const uint8_t> row, int32_t width, const PcxLayout& layout,
                            std::span<uint8_t> planes);

void TakePlane(std::span<const uint8_t> row, int32_t, const PcxLayout&, std::span<uint8_t> planes) {
  std::copy_n(row.begin(), planes.size(), planes.begin());
}

void TakeBitPlanes(std::span<const uint8_t> row, int32_t width, const PcxLayout& layout,
                   std::span<uint8_t> planes) {
  SplitBitPlanes(row.data(), static_cast<size_t>(width), layout.planes, layout.bytesPerLine,
                 planes.data());
}

void TakeColorPlanes(std::span<const uint8_t> row, int32_t width, const PcxLayout&,
                     std::span<uint8_t> planes) {
  const size_t count = static_cast<size_t>(width);
  uint8_t* red = planes.data();
  SplitColors(row.data(), count, red + 2 * count, red + count, red);
}

Status WriteLines(ByteWriter& out, const PcxLayout& layout, const PictureRecord& picture,
                  std::span<uint8_t> planes) {
  const PackedImage& image = picture.image;
  const TakePlanes take = layout.depth == 24  ? TakeColorPlanes
                          : layout.planes > 1 ? TakeBitPlanes
                                              : TakePlane;
  for (int32_t y = 0; y < image.Height() && !out.Failed(); ++y) {
    RETURN_IF_BAD(picture.ReportRow(y));
    take(image.Row(y), image.Width(), layout, planes);
    for (size_t begin = 0; begin < planes.size(); begin += layout.bytesPerLine) {
      out.Used(EncodePcxPlane(planes.subspan(begin, layout.bytesPerLine),
                              out.Reserve(2 * size_t{layout.bytesPerLine})));
    }
  }
  return Status::Ok;
}

}  // namespace

Status DescribePcx(const platform::FileView& file, const PcxPlace& place, PictureRecord& picture) {
  PcxHeader header;
  return DescribePicture(file, place, picture, header);
}

Status ReadPcx(platform::FileView& file, const PcxPlace& place, const ReadRequest& request,
               PictureRecord& picture) {
  PcxHeader header;
  RETURN_IF_BAD(DescribePicture(file, place, picture, header));
  PackedImage image;
  platform::MemoryBlock line;
  RETURN_IF_BAD(NewPackedImage(picture.width, picture.height, &picture.palette,
                               picture.bitsPerPixel, image,
                               request.partial ? platform::Fill::Zero : platform::Fill::Unset));
  if (!line.Allocate(header.LineSize() + PcxLineDecoder::kSlack))
    return Status::MemoryAllocationError;
  const SpreadRow spread = FindArrangement(header)->spread;
  const std::span<const uint8_t> decoded = line.Bytes().first(header.LineSize());
  PcxLineDecoder decoder(
      file.Bytes().subspan(place.begin + kHeaderSize, place.Size() - kHeaderSize));
  for (int32_t y = 0; y < header.height; ++y) {
    if (!decoder.Decode(line.Data(), header.LineSize())) {
      RETURN_IF_BAD(TakePart(picture, request.partial, Status::FileReadError, y));
      break;
    }
    spread(decoded, header, image.Row(y));
    file.DropBefore(static_cast<uint64_t>(decoder.Next() - file.Bytes().data()));
    RETURN_IF_BAD(picture.ReportRow(y));
  }
  if (!file.Intact()) return Status::FileReadError;
  picture.image = std::move(image);
  return Status::Ok;
}

Status WritePcx(ByteWriter& out, const PictureRecord& picture) {
  PcxLayout layout;
  RETURN_IF_BAD(ChooseLayout(picture, layout));
  platform::MemoryBlock planes;
  if (!planes.Allocate(uint64_t{layout.bytesPerLine} * layout.planes))
    return Status::MemoryAllocationError;
  WriteHeader(out, layout, picture);
  RETURN_IF_BAD(WriteLines(out, layout, picture, planes.Bytes()));
  if (layout.depth == 8) {
    out.U8(kTrailerMark);
    out.Bytes(picture.palette);
  }
  return Status::Ok;
}

Status PcxInfo(PictureRecord& picture, const ReadRequest& request) {
  platform::FileView file;
  if (!file.OpenHead(request.fileName.c_str(), kHeaderSize)) return Status::FileOpenError;
  return DescribePcx(file, {0, file.FileSize()}, picture);
}

Status PcxRead(PictureRecord& picture, const ReadRequest& request) {
  const ProgressScope progress(picture);
  picture.image.Free();
  picture.alpha.Free();
  platform::FileView file;
  if (!file.Open(request.fileName)) return Status::FileOpenError;
  return ReadPcx(file, {0, file.FileSize()}, request, picture);
}

Status PcxWrite(PictureRecord& picture, const WriteOptions& options) {
  const ProgressScope progress(picture);
  if (picture.image.Empty()) return Status::MemoryAllocationError;
  ByteWriter out;
  if (!out.Create(picture.fileName.c_str())) return Status::ErrorCreatingFile;
  RETURN_IF_BAD(WritePcx(out, picture));
  return CommitOutput(out, options);
}

}  // namespace fotomill
