// GEM rasters (IMG) of GEM Paint, Ventura Publisher and the Atari ST, big-endian.
//
//   offset size  field
//        0    2  version, 1 to 3
//        2    2  header size in words, at least 8
//        4    2  planes
//        6    2  bytes of a pattern, 1 to 8
//        8    4  width and height of a pixel, micrometers
//       12    4  width, height
//       16       extended header, see below
//        .       lines, top first, coded as described in gem_lines.h; a line consists of all planes
//                of a row, lowest first, each (width + 7) / 8 bytes
//
// Extensions of the header by various programs; standard files have none:
//
//   one word         of files with planes: 1 for grays, ignored here
//   "XIMG", model    2 bytes: 0 red, green, blue, 1 cyan, magenta, yellow; then three values of 2
//                    bytes, 0 to 1000, for each color
//   "STTT", count    2 bytes; then that many ST colors: 2 bytes 0RGB of 3 bits each, with the STE's
//                    lowest bit above them. Planes are stored one after the other.
//   0x0080           2 bytes; then ST colors
//   "TIMG", 3, r g b 2 bytes each: number of red, green and blue planes, in that order
//
// Without a palette, pixel 0 is white and the highest one black. More than 8 planes are packed
// pixels: 16 bits of 5-6-5, 24 of red, green, blue, 32 with a leading byte.
//
// The pixel aspect ratio is ignored. The writer stores black and white in the standard form, other
// palettes as XIMG, and 24 bits as packed pixels with the standard header, which other programs
// support; repeated rows are stored once. Source: J. Murray and W. vanRyper, "Encyclopedia of
// Graphics File Formats", 2nd edition (1996), with Digital Research's text; S. Sanders, "The Atari
// Compendium" (1993), appendix C; Dr. Bob, "Understanding color IMGs" (1992).
#include "formats/gem/gem.h"

#include <algorithm>
#include <array>
#include <cstring>
#include <vector>

#include "core/byte_reader.h"
#include "core/byte_writer.h"
#include "formats/amiga/iff_planes.h"
#include "formats/gem/gem_lines.h"
#include "formats/plain_codec.h"
#include "processing/palette/two_colors.h"
#include "processing/pixel_rows.h"
#include "processing/promote.h"

namespace fotomill {

namespace {

constexpr uint64_t kHeaderSize = 16;
constexpr uint64_t kMostHeaderSize = 2 * 65535;
constexpr uint16_t kMostPattern = 8;
constexpr uint16_t kPixelSize = 372;  // micrometers, as written by GEM Paint
constexpr uint32_t kHighest = 1000;   // maximum XIMG color value
constexpr uint16_t kRgbModel = 0, kCmyModel = 1, kHyperPaint = 0x80;
constexpr int kMostLineRepeats = 255;

// Layout of the pixels in a line.
enum class Form { Planes, WholePlanes, ColorPlanes, Pixels };

struct GemHeader {
  uint32_t size = 0;  // bytes
  int32_t planes = 0;
  uint16_t patternSize = 0;
  int32_t width = 0, height = 0;
  Form form = Form::Planes;
  std::array<int32_t, 3> colorPlanes{};  // for TIMG
  const char* name = "GEM raster";

  size_t PlaneSize() const { return (static_cast<size_t>(width) + 7) / 8; }
  size_t LineSize() const {
    const auto count = static_cast<size_t>(planes);
    if (form == Form::Pixels) return static_cast<size_t>(width) * ((count + 7) / 8);
    return PlaneSize() * (form == Form::WholePlanes ? 1 : count);
  }
};

// The default palette, 0xRRGGBB.
constexpr uint32_t kColors[] = {0xffffff, 0xff0000, 0x00ff00, 0xffff00, 0x0000ff, 0xff00ff,
                                0x00ffff, 0xaaaaaa, 0x555555, 0xaa0000, 0x00aa00, 0xaaaa00,
                                0x0000aa, 0xaa00aa, 0x00aaaa, 0x000000};

void SetColor(Palette& palette, size_t index, uint32_t color) {
  for (size_t c = 0; c < 3; ++c)
    palette[3 * index + c] = static_cast<uint8_t>(color >> (16 - 8 * c));
}

uint8_t ReverseBits(uint32_t byte) {
  uint32_t reversed = 0;
  for (int i = 0; i < 8; ++i) reversed |= (byte >> i & 1) << (7 - i);
  return static_cast<uint8_t>(reversed);
}

// Above 16 colors, pixels are grays with reversed bits, as written by snapshot programs.
void SetStandardColors(int32_t planes, Palette& palette) {
  const size_t count = size_t{1} << planes;
  for (size_t i = 0; i < count; ++i) {
    const uint32_t gray = 255u - ReverseBits(static_cast<uint32_t>(i));
    SetColor(palette, i, count > std::size(kColors) ? gray * 0x10101 : kColors[i]);
  }
  SetColor(palette, count - 1, 0);
}

// Values are 0 to 1000; CMY is inverted.
bool ReadExtendedColors(ByteReader& bytes, size_t count, Palette& palette) {
  const uint16_t model = bytes.Be16();
  if (model != kRgbModel && model != kCmyModel) return false;
  if (bytes.Left() < 6 * count) return true;
  for (size_t i = 0; i < 3 * count; ++i) {
    const uint32_t value = std::min<uint32_t>(bytes.Be16(), kHighest);
    const uint32_t light = model == kCmyModel ? kHighest - value : value;
    palette[i] = static_cast<uint8_t>((light * 255 + kHighest / 2) / kHighest);
  }
  return true;
}

// ST colors have three bits per channel; if the fourth is used, it is the STE's lowest.
void ReadAtariColors(ByteReader& bytes, size_t count, Palette& palette) {
  std::vector<uint16_t> colors(std::min<size_t>(count, bytes.Left() / 2));
  for (uint16_t& color : colors) color = bytes.Be16();
  const bool enhanced = std::ranges::any_of(colors, [](uint16_t c) { return (c & 0x888) != 0; });
  for (size_t i = 0; i < 3 * colors.size(); ++i) {
    const uint32_t value = colors[i / 3] >> (8 - 4 * (i % 3)) & 15u;
    palette[i] = static_cast<uint8_t>(enhanced ? ((value & 7) << 1 | value >> 3) * 17
                                               : ((value & 7) * 255 + 3) / 7);
  }
}

// Parses the header after its first 16 bytes. UnsupportedFormat.
Status ParseExtension(ByteReader& bytes, GemHeader& header, Palette& palette) {
  const size_t count = header.planes <= 8 ? size_t{1} << header.planes : 0;
  if (bytes.Match("XIMG")) {
    header.name = "GEM raster, XIMG";
    if (header.planes > 8) return Status::Ok;
    return ReadExtendedColors(bytes, count, palette) ? Status::Ok : Status::UnsupportedFormat;
  }
  if (bytes.Match("TIMG")) {
    header.name = "GEM raster, TIMG";
    bytes.Skip(2);
    int32_t all = 0;
    for (int32_t& planes : header.colorPlanes) all += planes = bytes.Be16();
    const bool known =
        bytes.Ok() && all == header.planes &&
        std::ranges::all_of(header.colorPlanes, [](int32_t n) { return n > 0 && n <= 8; });
    header.form = Form::ColorPlanes;
    return known ? Status::Ok : Status::UnsupportedFormat;
  }
  if (header.planes > 8) return Status::Ok;
  if (bytes.Match("STTT")) {
    header.name = "GEM raster, STTT";
    header.form = header.planes > 1 ? Form::WholePlanes : Form::Planes;
    palette.fill(0);
    ReadAtariColors(bytes, std::min<size_t>(bytes.Be16(), count), palette);
  } else if (bytes.Left() >= 2 + 2 * count && bytes.Be16() == kHyperPaint) {
    header.name = "GEM raster, HyperPaint";
    ReadAtariColors(bytes, count, palette);
  }
  return Status::Ok;
}

// `file` must contain the complete header.
Status ParseHeader(std::span<const uint8_t> file, GemHeader& header, Palette& palette) {
  ByteReader bytes(file);
  const uint16_t version = bytes.Be16();
  header.size = 2u * bytes.Be16();
  header.planes = bytes.Be16();
  header.patternSize = bytes.Be16();
  bytes.Skip(4);
  header.width = bytes.Be16();
  header.height = bytes.Be16();
  if (!bytes.Ok()) return Status::FileReadError;
  if (version < 1 || version > 3 || header.size < kHeaderSize || header.planes < 1 ||
      header.patternSize < 1 || header.patternSize > kMostPattern || header.width < 1 ||
      header.height < 1)
    return Status::DamagedFile;
  if (file.size() < header.size) return Status::FileReadError;
  MakeDefaultPalette(&palette, nullptr, kDisplayPalette);
  if (header.planes <= 8) SetStandardColors(header.planes, palette);
  header.form = header.planes > 8 ? Form::Pixels : Form::Planes;
  ByteReader rest(file.first(header.size));
  rest.Seek(kHeaderSize);
  RETURN_IF_BAD(ParseExtension(rest, header, palette));
  const bool pixels = header.planes == 16 || header.planes == 24 || header.planes == 32;
  return header.form == Form::Pixels && !pixels ? Status::UnsupportedFormat : Status::Ok;
}

Status DescribePicture(const platform::FileView& file, const ReadRequest&, GemHeader& header,
                       PictureRecord& picture) {
  RETURN_IF_BAD(ParseHeader(file.Bytes(), header, picture.palette));
  picture.typeName.AssignCut(header.name);
  const bool indices = header.form == Form::Planes || header.form == Form::WholePlanes;
  SetPlainFacts(picture, header.width, header.height, indices ? header.planes : 24);
  return Status::Ok;
}

// Converts a row of packed pixels.
void PutPixels(std::span<const uint8_t> line, int32_t planes, std::span<uint8_t> row) {
  const size_t size = static_cast<size_t>(planes) / 8, count = line.size() / size;
  if (planes == 24) {
    SwapColors(line.data(), count, row.data());
    return;
  }
  for (size_t x = 0; x < count; ++x) {
    const uint8_t* const pixel = &line[size * x];
    if (planes == 32) {
      std::reverse_copy(pixel + 1, pixel + 4, &row[3 * x]);
      continue;
    }
    const uint32_t value = static_cast<uint32_t>(pixel[0] << 8 | pixel[1]);
    const uint32_t blue = value & 31, green = value >> 5 & 63, red = value >> 11;
    row[3 * x] = static_cast<uint8_t>(blue << 3 | blue >> 2);
    row[3 * x + 1] = static_cast<uint8_t>(green << 2 | green >> 4);
    row[3 * x + 2] = static_cast<uint8_t>(red << 3 | red >> 2);
  }
}

// Converts a row with separate planes for each color.
void PutColorPlanes(std::span<const uint8_t> line, const GemHeader& header,
                    std::span<uint8_t> row) {
  std::vector<uint8_t> values(static_cast<size_t>(header.width));
  size_t offset = 0;
  for (size_t c = 0; c < 3; ++c) {
    const int32_t planes = header.colorPlanes[c];
    const uint32_t highest = (1u << planes) - 1;
    MergeIffPlanes(&line[offset], header.PlaneSize(), planes, values);
    for (size_t x = 0; x < values.size(); ++x)
      row[3 * x + 2 - c] = static_cast<uint8_t>((values[x] * 255u + highest / 2) / highest);
    offset += static_cast<size_t>(planes) * header.PlaneSize();
  }
}

// Converts a row of indices; `indices` has room for one byte per pixel.
void PutIndices(std::span<const uint8_t> line, const GemHeader& header, std::span<uint8_t> indices,
                PackedImage& image, int32_t y) {
  const auto row = image.Row(y);
  if (header.planes == 1) {
    std::memcpy(row.data(), line.data(), header.PlaneSize());
    return;
  }
  const bool bytes = image.Bits() == 8;
  const auto pixels = bytes ? row.first(static_cast<size_t>(header.width)) : indices;
  MergeIffPlanes(line.data(), header.PlaneSize(), header.planes, pixels);
  if (!bytes) PackIndices(pixels.data(), header.width, image.Bits(), row.data());
}

// Rearranges consecutively stored planes into lines with all planes of a row.
Status GatherPlanes(GemLines& source, const GemHeader& header, std::vector<uint8_t>& lines) {
  const auto height = static_cast<size_t>(header.height),
             planes = static_cast<size_t>(header.planes);
  RETURN_IF_BAD(CheckFileMemory(uint64_t{header.PlaneSize()} * planes * height +
                                PackedRowBytes(header.width, header.height, header.planes)));
  lines.resize(header.PlaneSize() * planes * height);
  for (size_t i = 0; i < planes * height; ++i) {
    const auto line = source.Next();
    if (line.empty()) return Status::FileReadError;
    const size_t place = i % height * planes + i / height;
    std::ranges::copy(line, lines.begin() + static_cast<ptrdiff_t>(place * header.PlaneSize()));
  }
  return Status::Ok;
}

Status Decode(platform::FileView& file, const GemHeader& header, const PictureRecord& picture,
              PackedImage& image) {
  RETURN_IF_BAD(
      NewPackedImage(header.width, header.height, &picture.palette, picture.bitsPerPixel, image));
  GemLines source(file.Bytes().subspan(header.size), header.LineSize(), header.patternSize);
  std::vector<uint8_t> gathered, indices(static_cast<size_t>(header.width));
  const bool whole = header.form == Form::WholePlanes;
  if (whole) RETURN_IF_BAD(GatherPlanes(source, header, gathered));
  const size_t size = header.PlaneSize() * static_cast<size_t>(header.planes);
  for (int32_t y = 0; y < header.height; ++y) {
    const auto line =
        whole ? std::span<const uint8_t>(gathered).subspan(static_cast<size_t>(y) * size, size)
              : source.Next();
    if (line.empty()) return Status::FileReadError;
    if (header.form == Form::Pixels) {
      PutPixels(line, header.planes, image.Row(y));
    } else if (header.form == Form::ColorPlanes) {
      PutColorPlanes(line, header, image.Row(y));
    } else {
      PutIndices(line, header, indices, image, y);
    }
    if (!whole) file.DropBefore(header.size + source.Position());
    RETURN_IF_BAD(picture.ReportRow(y));
  }
  return Status::Ok;
}

bool IsBlackAndWhite(const Palette& palette) {
  const auto begins = [&](const Palette& other) {
    return std::equal(other.begin(), other.begin() + 6, palette.begin());
  };
  return begins(BlackAndWhite(true)) || begins(BlackAndWhite(false));
}

// File layout for a picture to write.
struct GemLayout {
  uint16_t planes = 24, patternSize = 3;
  bool extended = false;
  uint8_t invert = 0;  // for black and white where set bits are white
};

GemLayout ChooseLayout(const PictureRecord& picture) {
  const auto bits = static_cast<uint16_t>(picture.image.Bits());
  if (bits == 24) return {};
  if (bits == 1 && IsBlackAndWhite(picture.palette))
    return {1, 1, false, static_cast<uint8_t>(IsDarkFirst(picture.palette) ? 0xff : 0)};
  return {bits, 1, true, 0};
}

void WriteHeader(ByteWriter& out, const PictureRecord& picture, const GemLayout& layout) {
  const size_t values = layout.extended ? 3 * (size_t{1} << layout.planes) : 0;
  const size_t size = kHeaderSize + (layout.extended ? 6 + 2 * values : 0);
  for (const size_t field :
       {size_t{1}, size / 2, size_t{layout.planes}, size_t{layout.patternSize}, size_t{kPixelSize},
        size_t{kPixelSize}, static_cast<size_t>(picture.image.Width()),
        static_cast<size_t>(picture.image.Height())}) {
    out.Be16(static_cast<uint16_t>(field));
  }
  if (!layout.extended) return;
  out.Text("XIMG");
  out.Be16(kRgbModel);
  for (size_t i = 0; i < values; ++i)
    out.Be16(static_cast<uint16_t>((picture.palette[i] * kHighest + 127) / 255));
}

// The file's line for row y.
void MakeLine(const PackedImage& image, int32_t y, const GemLayout& layout,
              std::span<uint8_t> indices, std::span<uint8_t> line) {
  const auto row = image.Row(y);
  const auto width = static_cast<size_t>(image.Width());
  const size_t planeSize = (width + 7) / 8;
  if (layout.planes == 24) {
    SwapColors(row.data(), width, line.data());
  } else if (layout.planes == 1) {
    for (size_t i = 0; i < planeSize; ++i) line[i] = row[i] ^ layout.invert;
    if (width % 8 != 0) line[planeSize - 1] &= static_cast<uint8_t>(0xff << (8 - width % 8));
  } else if (layout.planes == 4) {
    SplitBitPlanes(row.data(), width, 4, planeSize, line.data());
  } else {
    std::memcpy(indices.data(), row.data(), width);
    SplitIffPlanes(indices, planeSize, layout.planes, line.data());
  }
}

Status WriteRows(ByteWriter& out, const PictureRecord& picture, const GemLayout& layout) {
  const PackedImage& image = picture.image;
  const auto width = static_cast<size_t>(image.Width());
  const size_t size = layout.planes == 24 ? 3 * width : (width + 7) / 8 * layout.planes;
  const size_t part = layout.planes == 24 ? size : (width + 7) / 8;  // runs do not cross planes
  std::vector<uint8_t> line(size), next(size), indices(width), code;
  MakeLine(image, 0, layout, indices, next);
  for (int32_t y = 0; y < image.Height() && !out.Failed();) {
    line.swap(next);
    int repeats = 0;
    do {
      RETURN_IF_BAD(picture.ReportRow(y));
      ++y;
      ++repeats;
      if (y < image.Height()) MakeLine(image, y, layout, indices, next);
    } while (y < image.Height() && repeats < kMostLineRepeats && next == line);
    code.clear();
    if (repeats > 1) code.insert(code.end(), {0, 0, 0xff, static_cast<uint8_t>(repeats)});
    for (size_t x = 0; x < size; x += part)
      EncodeGemLine(std::span(line).subspan(x, part), layout.patternSize, code);
    out.Bytes(code);
  }
  return Status::Ok;
}

constexpr PlainCodec<GemHeader> kCodec = {kMostHeaderSize, DescribePicture, Decode};

}  // namespace

Status GemInfo(PictureRecord& picture, const ReadRequest& request) {
  return PlainInfo(kCodec, picture, request);
}

Status GemRead(PictureRecord& picture, const ReadRequest& request) {
  return PlainRead(kCodec, picture, request);
}

Status GemWrite(PictureRecord& picture, const WriteOptions& options) {
  const ProgressScope progress(picture);
  const PackedImage& image = picture.image;
  if (image.Empty()) return Status::MemoryAllocationError;
  const GemLayout layout = ChooseLayout(picture);
  ByteWriter out;
  if (!out.Create(picture.fileName.c_str())) return Status::ErrorCreatingFile;
  WriteHeader(out, picture, layout);
  RETURN_IF_BAD(WriteRows(out, picture, layout));
  return CommitOutput(out, options);
}

}  // namespace fotomill
