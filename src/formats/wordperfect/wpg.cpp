// WordPerfect graphics (WPG), little-endian: drawings, of which bitmaps are read.
//
//   offset size  field
//        0    4  FF "WPC"
//        4    4  offset of the first record
//        8    2  product 1, file type 0x16
//       10    2  version: 1.0 or 2.0
//       12    2  encryption key, 0: none
//       14    2  reserved
//
// Records of version 1 are a type, a size and data; in version 2 the type is preceded by a class
// and the size by a number of further records. Sizes are 1 byte; or FF and 2 bytes; or FF and 4
// bytes, the high word first, with its highest bit set.
//
//   version 1                                   version 2
//    0F  start: 1, 0, width, height              01  start
//        in 1/1200 inch
//    0E  colors: first 2, count 2, then          0C  colors: first 2, count 2, then red, green,
//        red, green, blue of each                    blue, alpha of each
//    0B  bitmap: width, height, depth,           0E  bitmap: width, height, color format 1,
//        resolutions 2 each, then rows               compression 1 (0 none, 1 runs), then rows
//    14  the same after 10 bytes of position
//    10  end                                     02  end
//
// Depths are 1, 2, 4 and 8 bits. Color formats are 1 to 4 for these depths, 6 for 5 bits per color,
// 8 red, green, blue, 9 with alpha, 12 gray. Rows are top first; for their coding see wpg_rows.h.
//
// Without a color map the colors are those of VGA; with 1 bit black and white. The reader ignores
// alpha, and the two bytes of a unit size that some programs write before uncompressed rows. The
// writer creates version 1 with a color map. Source: J. Murray and W. vanRyper, "Encyclopedia of
// Graphics File Formats", 2nd edition (1996), with WordPerfect Corporation's text; Corel,
// "WordPerfect Graphics Format", software developer's kit.
#include "formats/wordperfect/wpg.h"

#include <algorithm>
#include <cstring>
#include <vector>

#include "core/byte_reader.h"
#include "core/byte_writer.h"
#include "formats/plain_codec.h"
#include "formats/wordperfect/wpg_rows.h"
#include "processing/pixel_rows.h"
#include "processing/promote.h"

namespace fotomill {

namespace {

constexpr uint64_t kPrefixSize = 16;
constexpr std::string_view kMagic = "\xffWPC";
constexpr uint8_t kGraphics = 0x16;
constexpr uint8_t kStart1 = 0x0f, kColors1 = 0x0e, kBitmap1 = 0x0b, kPlacedBitmap1 = 0x14,
                  kEnd1 = 0x10;
constexpr uint8_t kColors2 = 0x0c, kBitmap2 = 0x0e, kEnd2 = 0x02;
constexpr uint32_t kUnitsPerInch = 1200;
constexpr uint32_t kResolution = 75;
constexpr uint8_t kUnitSizeToken = 0x7d;
constexpr int kMostRepeats = 255;

// Pixel format of a bitmap.
enum class Pixels { Index, Gray, Rgb555, Rgb, Rgba, Unknown };

struct Bitmap {
  int32_t width = 0, height = 0;
  Pixels pixels = Pixels::Index;
  int32_t bits = 0;
  WpgCoding coding = WpgCoding::Runs1;
  std::span<const uint8_t> code;
  Palette palette{};

  uint64_t Area() const { return static_cast<uint64_t>(width) * static_cast<uint64_t>(height); }
  size_t RowSize() const {
    return (static_cast<size_t>(width) * static_cast<size_t>(bits) + 7) / 8;
  }
  // Of the resulting picture.
  int32_t Depth() const { return pixels == Pixels::Index || pixels == Pixels::Gray ? bits : 24; }
};

// The default 256-color VGA palette: 16 colors, 16 grays, then 24 hues in three saturations at
// three intensities; the last 8 are black.
Palette VgaColors() {
  constexpr uint8_t kGrays[16] = {0, 5, 8, 11, 14, 17, 20, 24, 28, 32, 36, 40, 45, 50, 56, 63};
  // levels from minimum to maximum of a color, out of 63
  constexpr uint8_t kLevels[9][5] = {
      {0, 16, 31, 47, 63}, {31, 39, 47, 55, 63}, {45, 49, 54, 58, 63},
      {0, 7, 14, 21, 28},  {14, 17, 21, 24, 28}, {20, 22, 24, 26, 28},
      {0, 4, 8, 12, 16},   {8, 10, 12, 14, 16},  {11, 12, 13, 15, 16}};
  // red around the hue circle, starting at blue
  constexpr uint8_t kRed[24] = {0, 1, 2, 3, 4, 4, 4, 4, 4, 4, 4, 4,
                                4, 3, 2, 1, 0, 0, 0, 0, 0, 0, 0, 0};
  constexpr size_t kBrown = 6;
  Palette palette{};
  for (size_t i = 0; i < 16; ++i) {
    for (size_t c = 0; c < 3; ++c) {
      const size_t level = 2 * (i >> (2 - c) & 1) + (i >> 3);  // in thirds
      palette[3 * i + c] = static_cast<uint8_t>(85 * level);
    }
  }
  palette[3 * kBrown + 1] = 85;
  const auto widen = [](uint8_t value) { return static_cast<uint8_t>(value << 2 | value >> 4); };
  for (size_t i = 0; i < 16; ++i) std::fill_n(&palette[3 * (16 + i)], 3, widen(kGrays[i]));
  for (size_t i = 0; i < 9 * size_t{24}; ++i) {
    for (size_t c = 0; c < 3; ++c) {
      // green follows red by a third of the circle, and blue follows green
      const uint8_t level = kRed[(i % 24 + 24 - 8 * c) % 24];
      palette[3 * (32 + i) + c] = widen(kLevels[i / 24][level]);
    }
  }
  return palette;
}

// The size of a record, or the number of its sub-records.
uint64_t ReadSize(ByteReader& bytes) {
  const uint8_t first = bytes.U8();
  if (first < 0xff) return first;
  const uint32_t word = bytes.Le16();
  return (word & 0x8000) == 0 ? word : (word & 0x7fff) << 16 | bytes.Le16();
}

// Reads the colors of a map, `size` bytes each.
void ReadColors(std::span<const uint8_t> data, size_t size, Palette& palette) {
  ByteReader bytes(data);
  const size_t first = bytes.Le16(), count = bytes.Le16();
  for (size_t i = first; i < first + count && i < 256 && bytes.Left() >= size; ++i) {
    const auto color = bytes.Take(size);
    std::copy_n(color.begin(), 3, &palette[3 * i]);
  }
}

bool ReadBitmap1(std::span<const uint8_t> data, bool placed, Bitmap& bitmap) {
  ByteReader bytes(data);
  bytes.Skip(placed ? 10 : 0);
  bitmap.width = bytes.Le16();
  bitmap.height = bytes.Le16();
  bitmap.bits = bytes.Le16();
  bytes.Skip(4);
  const bool known = bitmap.bits == 1 || bitmap.bits == 2 || bitmap.bits == 4 || bitmap.bits == 8;
  bitmap.pixels = known ? Pixels::Index : Pixels::Unknown;
  bitmap.coding = WpgCoding::Runs1;
  bitmap.code = bytes.Take(bytes.Left());
  return bytes.Ok();
}

struct ColorFormat {
  uint8_t number;
  Pixels pixels;
  int32_t bits;
};
// clang-format off
constexpr ColorFormat kColorFormats[] = {
    {1, Pixels::Index, 1}, {2, Pixels::Index, 2}, {3, Pixels::Index, 4}, {4, Pixels::Index, 8},
    {6, Pixels::Rgb555, 16}, {8, Pixels::Rgb, 24}, {9, Pixels::Rgba, 32}, {12, Pixels::Gray, 8},
};
// clang-format on

bool ReadBitmap2(std::span<const uint8_t> data, Bitmap& bitmap) {
  ByteReader bytes(data);
  bitmap.width = bytes.Le16();
  bitmap.height = bytes.Le16();
  const uint8_t number = bytes.U8(), compression = bytes.U8();
  const auto* const format = std::ranges::find(kColorFormats, number, &ColorFormat::number);
  const bool known = format != std::end(kColorFormats) && compression < 2;
  bitmap.pixels = known ? format->pixels : Pixels::Unknown;
  bitmap.bits = known ? format->bits : 8;
  bitmap.coding = compression == 0 ? WpgCoding::Plain : WpgCoding::Runs2;
  const auto ahead = bytes.Peek(1);
  const uint64_t size = bitmap.RowSize() * static_cast<uint64_t>(bitmap.height);
  if (compression == 0 && bytes.Left() == size + 2 && ahead[0] == kUnitSizeToken) bytes.Skip(2);
  bitmap.code = bytes.Take(bytes.Left());
  return bytes.Ok();
}

// Keeps the larger bitmap, or if equal, the deeper one.
void KeepBetter(const Bitmap& found, Bitmap& best) {
  if (found.width < 1 || found.height < 1) return;
  if (std::pair(found.Area(), found.bits) > std::pair(best.Area(), best.bits)) best = found;
}

// Walks the records of version 1; `palette` is the palette so far.
void FindBitmap1(ByteReader& bytes, Palette& palette, Bitmap& best) {
  while (bytes.Left() > 0) {
    const uint8_t type = bytes.U8();
    const uint64_t size = ReadSize(bytes);
    const auto data = bytes.Take(std::min(size, bytes.Left()));
    Bitmap found;
    if (type == kEnd1) return;
    if (type == kColors1) ReadColors(data, 3, palette);
    if ((type == kBitmap1 || type == kPlacedBitmap1) &&
        ReadBitmap1(data, type == kPlacedBitmap1, found)) {
      found.palette = palette;
      KeepBetter(found, best);
    }
  }
}

void FindBitmap2(ByteReader& bytes, Palette& palette, Bitmap& best) {
  while (bytes.Left() > 0) {
    bytes.Skip(1);
    const uint8_t type = bytes.U8();
    (void)ReadSize(bytes);
    const uint64_t size = ReadSize(bytes);
    const auto data = bytes.Take(std::min(size, bytes.Left()));
    Bitmap found;
    if (type == kEnd2) return;
    if (type == kColors2) ReadColors(data, 4, palette);
    if (type == kBitmap2 && ReadBitmap2(data, found)) {
      found.palette = palette;
      KeepBetter(found, best);
    }
  }
}

Status FindBitmap(std::span<const uint8_t> file, Bitmap& bitmap) {
  ByteReader bytes(file);
  const bool magic = bytes.Match(kMagic);
  const uint32_t start = bytes.Le32();
  bytes.Skip(1);
  const uint8_t type = bytes.U8(), version = bytes.U8();
  bytes.Skip(1);
  const uint16_t key = bytes.Le16();
  if (file.size() >= kMagic.size() && !magic) return Status::DamagedFile;
  if (!bytes.Ok()) return Status::FileReadError;
  if (type != kGraphics || start < kPrefixSize) return Status::DamagedFile;
  if (key != 0) return Status::InvalidPassword;
  bytes.Seek(start);
  if (!bytes.Ok()) return Status::FileReadError;
  Palette palette = VgaColors();
  if (version == 1) {
    FindBitmap1(bytes, palette, bitmap);
  } else if (version == 2) {
    FindBitmap2(bytes, palette, bitmap);
  } else {
    return Status::UnsupportedFormat;
  }
  if (bitmap.width < 1) return Status::NoImages;
  return bitmap.pixels == Pixels::Unknown ? Status::UnsupportedFormat : Status::Ok;
}

Status DescribePicture(const platform::FileView& file, const ReadRequest&, Bitmap& bitmap,
                       PictureRecord& picture) {
  RETURN_IF_BAD(FindBitmap(file.Bytes(), bitmap));
  picture.typeName.AssignCut(bitmap.coding == WpgCoding::Runs1 ? "WordPerfect graphics, version 1"
                                                               : "WordPerfect graphics, version 2");
  SetPlainFacts(picture, bitmap.width, bitmap.height, bitmap.Depth());
  picture.palette = bitmap.palette;
  const Palette vga = VgaColors();
  const bool noMap = std::equal(vga.begin(), vga.begin() + 6, bitmap.palette.begin());
  if (bitmap.pixels == Pixels::Gray) picture.palette = GrayRamp();
  if (bitmap.bits == 1 && noMap)
    MakeDefaultPalette(&picture.palette, nullptr, kBlackAndWhitePalette);
  if (bitmap.Depth() == 24) MakeDefaultPalette(&picture.palette, nullptr, kDisplayPalette);
  return Status::Ok;
}

// Converts a row; 2-bit pixels become 4-bit ones.
void PutRow(std::span<const uint8_t> source, const Bitmap& bitmap, std::span<uint8_t> row) {
  const auto width = static_cast<size_t>(bitmap.width);
  if (bitmap.pixels == Pixels::Rgb) {
    SwapColors(source.data(), width, row.data());
  } else if (bitmap.pixels == Pixels::Rgba) {
    for (size_t x = 0; x < width; ++x)
      std::reverse_copy(&source[4 * x], &source[4 * x] + 3, &row[3 * x]);
  } else if (bitmap.pixels == Pixels::Rgb555) {
    for (size_t x = 0; x < width; ++x) {
      const uint32_t pixel = static_cast<uint32_t>(source[2 * x] | source[2 * x + 1] << 8);
      for (unsigned c = 0; c < 3; ++c) {
        const uint32_t value = pixel >> 5 * c & 31;
        row[3 * x + c] = static_cast<uint8_t>(value << 3 | value >> 2);
      }
    }
  } else if (bitmap.bits == 2) {
    for (size_t x = 0; x < width; x += 2) {
      const uint32_t pair = source[x / 4] >> (x % 4 == 0 ? 4 : 0) & 15u;
      row[x / 2] = static_cast<uint8_t>((pair & 12) << 2 | (pair & 3));
    }
  } else {
    std::ranges::copy(source, row.begin());
  }
}

Status Decode(platform::FileView& file, const Bitmap& bitmap, const PictureRecord& picture,
              PackedImage& image) {
  const uint64_t size = bitmap.RowSize() * static_cast<uint64_t>(bitmap.height);
  if (bitmap.coding == WpgCoding::Plain && bitmap.code.size() < size) return Status::FileReadError;
  RETURN_IF_BAD(
      NewPackedImage(bitmap.width, bitmap.height, &picture.palette, picture.bitsPerPixel, image));
  WpgRows rows(bitmap.code, bitmap.RowSize(), bitmap.coding);
  const auto offset = static_cast<uint64_t>(bitmap.code.data() - file.Bytes().data());
  for (int32_t y = 0; y < bitmap.height; ++y) {
    const auto row = rows.Next();
    if (row.empty()) return Status::FileReadError;
    PutRow(row, bitmap, image.Row(y));
    file.DropBefore(offset + rows.Position());
    RETURN_IF_BAD(picture.ReportRow(y));
  }
  return Status::Ok;
}

// Size of the size field of a record whose size is patched later.
constexpr size_t kLongSize = 5;
std::array<uint8_t, kLongSize> LongSize(uint64_t size) {
  return {0xff, static_cast<uint8_t>(size >> 16), static_cast<uint8_t>(0x80 | size >> 24),
          static_cast<uint8_t>(size), static_cast<uint8_t>(size >> 8)};
}

void WriteHead(ByteWriter& out, const PictureRecord& picture) {
  const PackedImage& image = picture.image;
  const auto width = static_cast<uint32_t>(image.Width()),
             height = static_cast<uint32_t>(image.Height());
  const uint32_t fitting = (std::max(width, height) * kUnitsPerInch + UINT16_MAX - 1) / UINT16_MAX;
  const uint32_t resolution = std::max(kResolution, fitting);
  out.Text(kMagic);
  out.Le32(kPrefixSize);
  for (const uint8_t value : {uint8_t{1}, kGraphics, uint8_t{1}, uint8_t{0}}) out.U8(value);
  out.Le32(0);
  for (const uint8_t value : {kStart1, uint8_t{6}, uint8_t{1}, uint8_t{0}}) out.U8(value);
  out.Le16(static_cast<uint16_t>(width * kUnitsPerInch / resolution));
  out.Le16(static_cast<uint16_t>(height * kUnitsPerInch / resolution));
  const auto colors = static_cast<size_t>(image.Colors());
  out.U8(kColors1);
  out.Bytes(LongSize(4 + 3 * colors));
  out.Le16(0);
  out.Le16(static_cast<uint16_t>(colors));
  out.Bytes(std::span(picture.palette).first(3 * colors));
  out.U8(kBitmap1);
  out.Bytes(LongSize(0));
  for (const uint32_t field :
       {width, height, static_cast<uint32_t>(image.Bits()), resolution, resolution})
    out.Le16(static_cast<uint16_t>(field));
}

Status WriteRows(ByteWriter& out, const PictureRecord& picture) {
  const PackedImage& image = picture.image;
  const size_t size =
      (static_cast<size_t>(image.Width()) * static_cast<size_t>(image.Bits()) + 7) / 8;
  const auto same = [&](int32_t y) {
    return std::ranges::equal(image.Row(y).first(size), image.Row(y - 1).first(size));
  };
  std::vector<uint8_t> code;
  for (int32_t y = 0; y < image.Height() && !out.Failed();) {
    RETURN_IF_BAD(picture.ReportRow(y));
    code.clear();
    EncodeWpgRow(image.Row(y).first(size), code);
    int repeats = 0;
    for (++y; y < image.Height() && repeats < kMostRepeats && same(y); ++y, ++repeats)
      RETURN_IF_BAD(picture.ReportRow(y));
    if (repeats > 0) code.insert(code.end(), {0, static_cast<uint8_t>(repeats)});
    out.Bytes(code);
  }
  return Status::Ok;
}

constexpr PlainCodec<Bitmap> kCodec = {UINT64_MAX, DescribePicture, Decode};

}  // namespace

Status WpgInfo(PictureRecord& picture, const ReadRequest& request) {
  return PlainInfo(kCodec, picture, request);
}

Status WpgRead(PictureRecord& picture, const ReadRequest& request) {
  return PlainRead(kCodec, picture, request);
}

Status WpgWrite(PictureRecord& picture, const WriteOptions& options) {
  const ProgressScope progress(picture);
  const PackedImage& image = picture.image;
  if (image.Empty()) return Status::MemoryAllocationError;
  if (image.Bits() > 8) return Status::TooManyColors;
  ByteWriter out;
  if (!out.Create(picture.fileName.c_str())) return Status::ErrorCreatingFile;
  WriteHead(out, picture);
  const uint64_t data = out.Position() - 10;  // including its five fields
  RETURN_IF_BAD(WriteRows(out, picture));
  const uint64_t size = out.Position() - data;
  if (size > INT32_MAX) return Status::UnsuitableImage;
  out.Patch(data - kLongSize, LongSize(size));
  out.U8(kEnd1);
  out.U8(0);
  return CommitOutput(out, options);
}

}  // namespace fotomill
