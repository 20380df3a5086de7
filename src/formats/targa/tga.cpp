// Truevision Targa (TGA), little-endian.
//
//   offset size  field
//        0    1  length of the identification text after the header
//        1    1  1: there is a color map
//        2    1  type: 1 color-mapped, 2 true color, 3 gray; 9, 10, 11 the same with run-length
//                packets
//        3    2  first color map index
//        5    2  color map entries
//        7    1  bits per entry: 15, 16, 24 or 32
//        8    4  two origins, ignored
//       12    2  width
//       14    2  height
//       16    1  bits per pixel: 8, 15, 16, 24 or 32
//       17    1  descriptor: low four bits attribute (alpha) bits; 0x10 right to left, 0x20 top row
//                first
//       18       identification text, color map, pixels
//   end-26   26  footer of version 2: offsets of the extension area and the developer area,
//                "TRUEVISION-XFILE." and 0
//
// 15 and 16-bit pixels are A RRRRR GGGGG BBBBB, 24 and 32-bit ones blue, green, red (alpha); 16-bit
// grays are gray and alpha. A packet is a byte n and one pixel, repeated n - 127 times (n >= 128),
// or n + 1 literal pixels.
//
// The reader accepts packets that continue in the next row. Attribute bits are used as alpha if the
// descriptor has them and the extension area, if there is one, does not declare them useless; an
// alpha plane that is entirely transparent is considered unset and dropped, as many programs leave
// these bits zero.
//
// The writer stores uncompressed rows, bottom row first, which every reader supports, with a
// version 2 footer: up to 8 bits as color-mapped (grays as gray), 24 bits, 32 with an alpha plane;
// 16 bits with CreateTarga16. Source: Truevision, "TGA File Format Specification, Version 2.0"
// (1991).
#include "formats/targa/tga.h"

#include <algorithm>
#include <cstring>
#include <vector>

#include "core/byte_reader.h"
#include "core/byte_writer.h"
#include "picture/partial.h"
#include "platform/file_view.h"

namespace fotomill {

namespace {

constexpr uint64_t kHeaderSize = 18, kFooterSize = 26;
constexpr uint8_t kRunLengthType = 8;  // flag in the type
constexpr uint8_t kMapped = 1, kTrueColor = 2, kGray = 3;
constexpr uint8_t kFromRight = 0x10, kFromTop = 0x20;
constexpr uint64_t kAttributeTypeOffset = 494;  // in the extension area
constexpr uint8_t kUsefulAlpha = 3;             // lower attribute types are not alpha
constexpr std::string_view kSignature("TRUEVISION-XFILE.\0", 18);

struct TgaHeader {
  uint8_t idLength = 0;
  uint8_t mapType = 0;
  uint8_t type = 0;  // without kRunLengthType
  bool runLength = false;
  uint16_t mapFirst = 0, mapLength = 0;
  uint8_t mapBits = 0;
  int32_t width = 0, height = 0;
  uint8_t bits = 0;
  uint8_t descriptor = 0;

  uint64_t PixelSize() const { return (bits + 7u) / 8; }
  uint64_t MapSize() const { return mapType == 0 ? 0 : uint64_t{mapLength} * ((mapBits + 7u) / 8); }
  uint64_t MapOffset() const { return kHeaderSize + idLength; }
  uint64_t PixelOffset() const { return MapOffset() + MapSize(); }
  int32_t AttributeBits() const { return descriptor & 15; }
  // Whether the pixels, or the colors of the map, have bits that may be alpha.
  bool HasAttribute() const {
    if (AttributeBits() == 0) return false;
    const int32_t colorBits = type == kMapped ? mapBits : bits;
    return colorBits == 32 || colorBits == 16;
  }
  bool Indexed() const {
    return (type == kMapped && !HasAttribute()) || (type == kGray && bits == 8);
  }
};

bool DepthFits(const TgaHeader& header) {
  const auto isColor = [](uint8_t bits) {
    return bits == 15 || bits == 16 || bits == 24 || bits == 32;
  };
  if (header.type == kMapped)
    return header.mapType == 1 && header.bits == 8 && isColor(header.mapBits);
  if (header.type == kGray) return header.bits == 8 || header.bits == 16;
  return isColor(header.bits);
}

// Ok; FileReadError for a truncated header, NoImages for type 0, UnsupportedFormat for an
// unsupported type or depth, DamagedFile for invalid values.
Status ParseHeader(std::span<const uint8_t> file, TgaHeader& header) {
  ByteReader bytes(file);
  header.idLength = bytes.U8();
  header.mapType = bytes.U8();
  const uint8_t type = bytes.U8();
  header.mapFirst = bytes.Le16();
  header.mapLength = bytes.Le16();
  header.mapBits = bytes.U8();
  bytes.Skip(4);
  header.width = bytes.Le16();
  header.height = bytes.Le16();
  header.bits = bytes.U8();
  header.descriptor = bytes.U8();
  if (!bytes.Ok()) return Status::FileReadError;
  header.runLength = (type & kRunLengthType) != 0;
  header.type = static_cast<uint8_t>(type & ~kRunLengthType);
  if (header.mapType > 1) return Status::DamagedFile;
  if (type == 0) return Status::NoImages;
  if (type == 32 || type == 33) return Status::UnsupportedFormat;
  if (header.type < kMapped || header.type > kGray || type > 11) return Status::DamagedFile;
  if (header.width < 1 || header.height < 1) return Status::DamagedFile;
  return DepthFits(header) ? Status::Ok : Status::UnsupportedFormat;
}

struct Color {
  uint8_t blue, green, red, alpha;
};

uint8_t FiveToEight(uint32_t value) { return static_cast<uint8_t>(value << 3 | value >> 2); }

// A color of 15 to 32 bits, or a 16-bit gray.
Color ColorFrom(const uint8_t* bytes, int32_t bits) {
  if (bits >= 24) return {bytes[0], bytes[1], bytes[2], bits == 32 ? bytes[3] : uint8_t{255}};
  const uint32_t value = static_cast<uint32_t>(bytes[0] | bytes[1] << 8);
  const uint8_t alpha = bits == 16 && (value & 0x8000) == 0 ? 0 : 255;
  return {FiveToEight(value & 31), FiveToEight(value >> 5 & 31), FiveToEight(value >> 10 & 31),
          alpha};
}

using ColorMap = std::array<Color, 256>;

// Stores the map's colors at their indices; missing entries and those beyond 255 are ignored.
// FileReadError if the map is truncated.
Status ReadColorMap(std::span<const uint8_t> file, const TgaHeader& header, ColorMap& map) {
  map.fill({0, 0, 0, 255});
  if (header.type != kMapped) return Status::Ok;
  ByteReader bytes(file);
  bytes.Seek(header.MapOffset());
  const auto entries = bytes.Take(header.MapSize());
  if (!bytes.Ok()) return Status::FileReadError;
  const size_t entrySize = (header.mapBits + 7u) / 8;
  for (size_t i = 0; i < header.mapLength && header.mapFirst + i < map.size(); ++i) {
    map[header.mapFirst + i] = ColorFrom(&entries[i * entrySize], header.mapBits);
  }
  return Status::Ok;
}

void DescribePicture(const TgaHeader& header, PictureRecord& picture) {
  constexpr const char* kNames[] = {"Targa, color-mapped", "Targa, true color", "Targa, gray"};
  picture.typeName.AssignCut(kNames[header.type - 1]);
  picture.width = header.width;
  picture.height = header.height;
  picture.bitsPerPixel = header.Indexed() ? 8 : 24;
  const bool alpha = header.HasAttribute();
  picture.alphaFlags =
      static_cast<uint8_t>((picture.alphaFlags & ~kHasAlpha) | (alpha ? kHasAlpha : 0));
  picture.imageBytes = EstimateImageBytes(picture.width, picture.height, picture.bitsPerPixel);
}

void SetPalette(const TgaHeader& header, const ColorMap& map, Palette& palette) {
  if (!header.Indexed()) {
    MakeDefaultPalette(&palette, nullptr, kDisplayPalette);
  } else if (header.type == kGray) {
    palette = GrayRamp();
  } else {
    for (size_t i = 0; i < map.size(); ++i) {
      palette[3 * i] = map[i].red;
      palette[3 * i + 1] = map[i].green;
      palette[3 * i + 2] = map[i].blue;
    }
  }
}

// Whether the extension area of a version 2 file says that the attribute bits are not alpha.
bool AttributeIsUseless(std::span<const uint8_t> file) {
  if (file.size() < kFooterSize + kHeaderSize) return false;
  ByteReader footer(file.last(kFooterSize));
  const uint32_t extension = footer.Le32();
  footer.Skip(4);
  if (!footer.Match(kSignature) || extension == 0) return false;
  ByteReader bytes(file);
  bytes.Seek(uint64_t{extension} + kAttributeTypeOffset);
  const uint8_t attributeType = bytes.U8();
  return bytes.Ok() && attributeType < kUsefulAlpha;
}

// Delivers the unpacked bytes row by row.
class RowSource {
 public:
  RowSource(ByteReader& bytes, const TgaHeader& header)
      : bytes_(bytes),
        runLength_(header.runLength),
        pixelSize_(header.PixelSize()),
        row_(pixelSize_ * static_cast<uint64_t>(header.width)) {}

  // The next row; empty if the data are truncated. Valid until the next call.
  std::span<const uint8_t> Next() {
    if (!runLength_) return bytes_.Take(row_.size());
    uint64_t filled = 0;
    while (filled < row_.size()) {
      if (left_ == 0 && !BeginPacket()) return {};
      const uint64_t count = std::min(left_ * pixelSize_, row_.size() - filled);
      if (isRun_) {
        for (uint64_t i = 0; i < count; i += pixelSize_)
          std::memcpy(&row_[filled + i], value_.data(), pixelSize_);
      } else {
        const auto pixels = bytes_.Take(count);
        if (pixels.empty()) return {};
        std::memcpy(&row_[filled], pixels.data(), count);
      }
      filled += count;
      left_ -= count / pixelSize_;
    }
    return row_;
  }

 private:
  bool BeginPacket() {
    const uint8_t head = bytes_.U8();
    isRun_ = (head & 0x80) != 0;
    left_ = (head & 0x7Fu) + 1;
    if (isRun_) value_ = bytes_.Take(pixelSize_);
    return bytes_.Ok();
  }

  ByteReader& bytes_;
  const bool runLength_;
  const uint64_t pixelSize_;
  std::vector<uint8_t> row_;
  uint64_t left_ = 0;  // remaining pixels of the packet
  bool isRun_ = false;
  std::span<const uint8_t> value_;  // the pixel repeated by a run
};

// Converts a row of the file to indices, or to colors and alpha (empty without a plane).
using RowReader = void (*)(std::span<const uint8_t> source, int32_t width, const ColorMap& map,
                           std::span<uint8_t> row, std::span<uint8_t> alpha);

void CopyRow(std::span<const uint8_t> source, int32_t, const ColorMap&, std::span<uint8_t> row,
             std::span<uint8_t>) {
  std::memcpy(row.data(), source.data(), source.size());
}

template <typename ColorAt>
void ReadColors(int32_t width, std::span<uint8_t> row, std::span<uint8_t> alpha, ColorAt colorAt) {
  uint8_t* place = row.data();
  for (size_t x = 0; x < static_cast<size_t>(width); ++x, place += 3) {
    const Color color = colorAt(x);
    place[0] = color.blue;
    place[1] = color.green;
    place[2] = color.red;
    if (!alpha.empty()) alpha[x] = color.alpha;
  }
}

template <int32_t bits>
void ReadTrueColor(std::span<const uint8_t> source, int32_t width, const ColorMap&,
                   std::span<uint8_t> row, std::span<uint8_t> alpha) {
  ReadColors(width, row, alpha,
             [&](size_t x) { return ColorFrom(&source[x * ((bits + 7) / 8)], bits); });
}

void ReadMapped(std::span<const uint8_t> source, int32_t width, const ColorMap& map,
                std::span<uint8_t> row, std::span<uint8_t> alpha) {
  ReadColors(width, row, alpha, [&](size_t x) { return map[source[x]]; });
}

void ReadGrayAlpha(std::span<const uint8_t> source, int32_t width, const ColorMap&,
                   std::span<uint8_t> row, std::span<uint8_t> alpha) {
  ReadColors(width, row, alpha, [&](size_t x) {
    const uint8_t gray = source[2 * x];
    return Color{gray, gray, gray, source[2 * x + 1]};
  });
}

RowReader ChooseRowReader(const TgaHeader& header) {
  if (header.Indexed()) return CopyRow;
  if (header.type == kMapped) return ReadMapped;
  if (header.type == kGray) return ReadGrayAlpha;
  switch (header.bits) {
    case 15: return ReadTrueColor<15>;
    case 16: return ReadTrueColor<16>;
    case 24: return CopyRow;
    default: return ReadTrueColor<32>;
  }
}

void MirrorRow(std::span<uint8_t> row, int32_t width, size_t pixelSize) {
  for (int32_t left = 0, right = width - 1; left < right; ++left, --right) {
    uint8_t* a = &row[static_cast<size_t>(left) * pixelSize];
    std::swap_ranges(a, a + pixelSize, &row[static_cast<size_t>(right) * pixelSize]);
  }
}

// `done`: rows read.
Status ReadRows(ByteReader& bytes, platform::FileView& file, const TgaHeader& header,
                const ColorMap& map, const PictureRecord& picture, PackedImage& image,
                PackedImage& alpha, int32_t& done) {
  const RowReader readRow = ChooseRowReader(header);
  const size_t pixelSize = image.Bits() == 8 ? 1 : 3;
  RowSource source(bytes, header);
  for (int32_t r = 0; r < header.height; ++r) {
    done = r;
    const auto raw = source.Next();
    if (raw.empty()) return Status::FileReadError;
    const int32_t stored = (header.descriptor & kFromTop) != 0 ? header.height - 1 - r : r;
    const auto row = image.StoredRow(stored);
    const auto opacity = alpha.Empty() ? std::span<uint8_t>() : alpha.StoredRow(stored);
    readRow(raw, header.width, map, row, opacity);
    if ((header.descriptor & kFromRight) != 0) {
      MirrorRow(row, header.width, pixelSize);
      if (!opacity.empty()) MirrorRow(opacity, header.width, 1);
    }
    file.DropBefore(bytes.Position());
    RETURN_IF_BAD(picture.ReportRow(r));
  }
  return file.Intact() ? Status::Ok : Status::FileReadError;
}

bool AnyOpacity(const PackedImage& alpha) {
  return std::ranges::any_of(alpha.Rows(), [](uint8_t value) { return value != 0; });
}

// File layout for a picture to write.
struct TgaLayout {
  uint8_t type = kTrueColor;
  int32_t bits = 24;  // per pixel
  int32_t attributeBits = 0;
};

TgaLayout ChooseLayout(const PictureRecord& picture, bool in16Bits) {
  if (picture.image.Bits() <= 8) {
    const bool isGray = picture.image.Bits() == 8 && picture.palette == GrayRamp();
    return {isGray ? kGray : kMapped, 8, 0};
  }
  const bool alpha = !picture.alpha.Empty();
  if (in16Bits) return {kTrueColor, 16, alpha ? 1 : 0};
  return {kTrueColor, alpha ? 32 : 24, alpha ? 8 : 0};
}

void WriteHeader(ByteWriter& out, const PictureRecord& picture, const TgaLayout& layout) {
  const bool mapped = layout.type == kMapped;
  out.U8(0);
  out.U8(mapped ? 1 : 0);
  out.U8(layout.type);
  out.Le16(0);
  out.Le16(mapped ? static_cast<uint16_t>(picture.image.Colors()) : 0);
  out.U8(mapped ? 24 : 0);
  out.Le32(0);
  out.Le16(static_cast<uint16_t>(picture.image.Width()));
  out.Le16(static_cast<uint16_t>(picture.image.Height()));
  out.U8(static_cast<uint8_t>(layout.bits));
  out.U8(static_cast<uint8_t>(layout.attributeBits));
  if (!mapped) return;
  for (size_t i = 0; i < 3 * static_cast<size_t>(picture.image.Colors()); i += 3) {
    out.U8(picture.palette[i + 2]);
    out.U8(picture.palette[i + 1]);
    out.U8(picture.palette[i]);
  }
}

uint16_t SixteenBits(const uint8_t* color, bool opaque) {
  return static_cast<uint16_t>(color[2] >> 3 << 10 | color[1] >> 3 << 5 | color[0] >> 3 |
                               (opaque ? 0x8000 : 0));
}

void WriteRow(const PictureRecord& picture, int32_t r, const TgaLayout& layout,
              std::vector<uint8_t>& bytes) {
  const auto row = picture.image.StoredRow(r);
  const auto width = static_cast<size_t>(picture.image.Width());
  const size_t bits = static_cast<size_t>(picture.image.Bits());
  const auto alpha =
      picture.alpha.Empty() ? std::span<const uint8_t>() : picture.alpha.StoredRow(r);
  if (layout.bits == 8) {
    const size_t perByte = 8 / bits;
    const uint8_t mask = static_cast<uint8_t>((1u << bits) - 1);
    for (size_t x = 0; x < width; ++x) {
      bytes[x] =
          static_cast<uint8_t>(row[x / perByte] >> (perByte - 1 - x % perByte) * bits & mask);
    }
  } else if (layout.bits == 16) {
    for (size_t x = 0; x < width; ++x) {
      const uint16_t pixel = SixteenBits(&row[3 * x], layout.attributeBits > 0 && alpha[x] >= 128);
      bytes[2 * x] = static_cast<uint8_t>(pixel);
      bytes[2 * x + 1] = static_cast<uint8_t>(pixel >> 8);
    }
  } else if (layout.bits == 32) {
    for (size_t x = 0; x < width; ++x) {
      std::memcpy(&bytes[4 * x], &row[3 * x], 3);
      bytes[4 * x + 3] = alpha[x];
    }
  } else {
    std::memcpy(bytes.data(), row.data(), bytes.size());
  }
}

// A quick check whether the attribute is alpha: not if all pixels are transparent. If the first
// kMostPixels do not decide, the descriptor is trusted.
bool ShowsOpacity(std::span<const uint8_t> file, const TgaHeader& header, const ColorMap& map) {
  constexpr uint64_t kMostPixels = 1 << 18;
  if (AttributeIsUseless(file)) return false;
  ByteReader bytes(file);
  bytes.Seek(header.PixelOffset());
  const RowReader readRow = ChooseRowReader(header);
  RowSource source(bytes, header);
  const auto width = static_cast<size_t>(header.width);
  std::vector<uint8_t> row(3 * width), alpha(width);
  uint64_t pixels = 0;
  for (int32_t r = 0; r < header.height; ++r, pixels += width) {
    if (pixels > kMostPixels) return true;
    const auto raw = source.Next();
    if (raw.empty()) return false;
    readRow(raw, header.width, map, row, alpha);
    if (std::ranges::any_of(alpha, [](uint8_t value) { return value != 0; })) return true;
  }
  return false;
}

// Reads everything before the pixels, and fills in the record.
Status TakeHead(std::span<const uint8_t> file, TgaHeader& header, ColorMap& map,
                PictureRecord& picture) {
  RETURN_IF_BAD(ParseHeader(file, header));
  RETURN_IF_BAD(ReadColorMap(file, header, map));
  DescribePicture(header, picture);
  SetPalette(header, map, picture.palette);
  return Status::Ok;
}

}  // namespace

Status TgaInfo(PictureRecord& picture, const ReadRequest& request) {
  picture.typeName.Clear();
  platform::FileView file;
  if (!file.OpenHead(request.fileName.c_str(), 65536)) return Status::FileOpenError;
  picture.fileSize = file.FileSize();
  TgaHeader header;
  ColorMap map;
  RETURN_IF_BAD(TakeHead(file.Bytes(), header, map, picture));
  if (!header.HasAttribute()) return Status::Ok;
  platform::FileView whole;
  if (!whole.Open(request.fileName)) return Status::FileOpenError;
  if (!ShowsOpacity(whole.Bytes(), header, map))
    picture.alphaFlags &= static_cast<uint8_t>(~kHasAlpha);
  return Status::Ok;
}

Status TgaRead(PictureRecord& picture, const ReadRequest& request) {
  const ProgressScope progress(picture);
  picture.image.Free();
  picture.alpha.Free();
  platform::FileView file;
  if (!file.Open(request.fileName)) return Status::FileOpenError;
  TgaHeader header;
  ColorMap map;
  RETURN_IF_BAD(TakeHead(file.Bytes(), header, map, picture));

  ByteReader bytes(file.Bytes());
  bytes.Seek(header.PixelOffset());
  const uint64_t pixels =
      static_cast<uint64_t>(header.width) * static_cast<uint64_t>(header.height);
  const uint64_t least =
      header.runLength ? pixels / 128 * (1 + header.PixelSize()) : pixels * header.PixelSize();
  const bool mayBeWhole = bytes.Ok() && bytes.Left() >= least;
  if (!mayBeWhole && !request.partial) return Status::FileReadError;
  PackedImage image, alpha;
  RETURN_IF_BAD(NewPackedImage(header.width, header.height, &picture.palette, picture.bitsPerPixel, image));
  if (header.HasAttribute() && !AttributeIsUseless(file.Bytes())) {
    RETURN_IF_BAD(NewAlphaPlane(header.width, header.height, alpha));
  }
  int32_t rows = 0;
  const Status status = ReadRows(bytes, file, header, map, picture, image, alpha, rows);
  RETURN_IF_BAD(TakePart(picture, request.partial, status, rows));
  if (!alpha.Empty() && !AnyOpacity(alpha)) alpha.Free();
  picture.image = std::move(image);
  picture.alpha = std::move(alpha);
  return Status::Ok;
}

Status TgaWrite(PictureRecord& picture, const WriteOptions& options) {
  const ProgressScope progress(picture);
  const PackedImage& image = picture.image;
  if (image.Empty()) return Status::MemoryAllocationError;
  ByteWriter out;
  if (!out.Create(picture.fileName.c_str())) return Status::ErrorCreatingFile;
  const TgaLayout layout = ChooseLayout(picture, options.encode.targa16);
  WriteHeader(out, picture, layout);
  std::vector<uint8_t> row(static_cast<size_t>(image.Width()) *
                           static_cast<size_t>(layout.bits / 8));
  for (int32_t r = 0; r < image.Height() && !out.Failed(); ++r) {
    RETURN_IF_BAD(picture.ReportRow(r));
    WriteRow(picture, r, layout, row);
    out.Bytes(row);
  }
  out.Zeros(8);
  out.Text(kSignature);
  return CommitOutput(out, options);
}

}  // namespace fotomill
