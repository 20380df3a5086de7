// Sun raster (RAS), big-endian.
//
//   offset size  field
//        0    4  magic number 0x59A66A95
//        4    8  width, height
//       12    4  bits per pixel: 1, 8, 24 or 32
//       16    4  size of the pixels, 0 in old files
//       20    4  type: 0 old, 1 standard, 2 byte-encoded, 3 RGB
//       24    4  color map type: 0 none, 1 RGB planes, 2 raw
//       28    4  size of the color map
//       32       color map: all red values, all green ones, all blue ones
//        .       rows, top first, each padded to 16 bits
//
// 24-bit pixels are blue, green, red, in files of type RGB red, green, blue; 32-bit ones have an
// unused byte in front. Without a map, set bits are black, and 8 bits are gray. In byte-encoded
// pixels, 128 precedes a count n and a value that is repeated n + 1 times; a count of 0 has no
// value and means a literal 128. Runs may continue across rows.
//
// The writer creates standard files without runs, which every reader supports: black and white in 1
// bit, other palettes in 8 bits with a map (grays without one), everything else in 24 bits. Source:
// Sun Microsystems, SunOS Reference Manual, rasterfile(5).
#include "formats/sunraster/ras.h"

#include <algorithm>
#include <cstring>
#include <vector>

#include "core/byte_reader.h"
#include "core/byte_writer.h"
#include "formats/plain_codec.h"
#include "processing/pixel_rows.h"

namespace fotomill {

namespace {

constexpr uint64_t kHeaderSize = 32;
constexpr uint64_t kHeadSize = kHeaderSize + 768;  // including the largest map in use
constexpr uint32_t kMagic = 0x59A66A95;
constexpr uint32_t kOld = 0, kStandard = 1, kByteEncoded = 2, kRgb = 3;
constexpr uint32_t kNoMap = 0, kRgbMap = 1, kRawMap = 2;
constexpr uint8_t kEscape = 128;

struct RasHeader {
  uint32_t width = 0, height = 0;
  uint32_t bits = 0;
  uint32_t type = kStandard;
  uint32_t mapType = kNoMap, mapSize = 0;  // bytes

  uint64_t RowSize() const { return (uint64_t{width} * bits + 15) / 16 * 2; }
  uint64_t PixelOffset() const { return kHeaderSize + mapSize; }
};

// Ok; FileReadError for a truncated header, DamagedFile for invalid values, UnsupportedFormat.
Status ParseHeader(std::span<const uint8_t> file, RasHeader& header) {
  ByteReader bytes(file);
  const uint32_t magic = bytes.Be32();
  header.width = bytes.Be32();
  header.height = bytes.Be32();
  header.bits = bytes.Be32();
  bytes.Skip(4);
  header.type = bytes.Be32();
  header.mapType = bytes.Be32();
  header.mapSize = bytes.Be32();
  if (file.size() >= 4 && magic != kMagic) return Status::DamagedFile;
  if (!bytes.Ok()) return Status::FileReadError;
  if (header.width < 1 || header.height < 1 || header.width > INT32_MAX ||
      header.height > INT32_MAX)
    return Status::DamagedFile;
  if (header.mapType > kRawMap) return Status::DamagedFile;
  const bool depthKnown =
      header.bits == 1 || header.bits == 8 || header.bits == 24 || header.bits == 32;
  return depthKnown && header.type <= kRgb ? Status::Ok : Status::UnsupportedFormat;
}

// The colors of the map, or the default colors without one.
void ReadPalette(std::span<const uint8_t> file, const RasHeader& header, Palette& palette) {
  MakeDefaultPalette(&palette, nullptr, header.bits > 8 ? kDisplayPalette : kBlackAndWhitePalette);
  if (header.bits > 8) return;
  if (header.bits == 8) palette = GrayRamp();
  if (header.bits == 1) std::swap_ranges(palette.begin(), palette.begin() + 3, palette.begin() + 3);
  const uint64_t colors = std::min<uint64_t>(header.mapSize / 3, uint64_t{1} << header.bits),
                 plane = header.mapSize / 3;
  ByteReader bytes(file);
  bytes.Seek(kHeaderSize);
  const auto map = bytes.Take(std::min<uint64_t>(header.mapSize, bytes.Left()));
  if (header.mapType != kRgbMap || colors == 0 || map.size() < 2 * plane + colors) return;
  for (size_t i = 0; i < colors; ++i) {
    for (size_t c = 0; c < 3; ++c) palette[3 * i + c] = map[c * plane + i];
  }
}

Status DescribePicture(const platform::FileView& file, const ReadRequest&, RasHeader& header,
                       PictureRecord& picture) {
  constexpr const char* kNames[] = {"Sun raster, old", "Sun raster", "Sun raster, byte-encoded",
                                    "Sun raster, RGB"};
  RETURN_IF_BAD(ParseHeader(file.Bytes(), header));
  picture.typeName.AssignCut(kNames[header.type]);
  SetPlainFacts(picture, static_cast<int32_t>(header.width), static_cast<int32_t>(header.height),
                static_cast<int32_t>(std::min(header.bits, 24u)));
  ReadPalette(file.Bytes(), header, picture.palette);
  return Status::Ok;
}

// Delivers the decoded bytes row by row.
class RowSource {
 public:
  RowSource(std::span<const uint8_t> pixels, const RasHeader& header)
      : bytes_(pixels),
        encoded_(header.type == kByteEncoded),
        size_(header.RowSize()),
        row_(encoded_ ? size_ : 0) {}

  // The next row; empty if the data are truncated. Valid until the next call.
  std::span<const uint8_t> Next() {
    if (!encoded_) return bytes_.Take(size_);
    for (uint64_t filled = 0; filled < size_;) {
      if (run_ == 0 && !TakePlain(filled)) return {};
      const uint64_t count = std::min(run_, size_ - filled);
      std::memset(row_.data() + filled, value_, count);
      filled += count;
      run_ -= count;
    }
    return row_;
  }
  uint64_t Position() const { return bytes_.Position(); }

 private:
  // Copies literals up to the next escape, which starts a run. False at the end of the data.
  bool TakePlain(uint64_t& filled) {
    const auto ahead = bytes_.Peek(size_ - filled);
    const auto escape = std::find(ahead.begin(), ahead.end(), kEscape);
    const auto plain = static_cast<uint64_t>(escape - ahead.begin());
    std::memcpy(row_.data() + filled, ahead.data(), plain);
    bytes_.Skip(plain);
    filled += plain;
    if (escape == ahead.end()) return filled == size_;
    bytes_.Skip(1);
    run_ = uint64_t{bytes_.U8()} + 1;
    value_ = run_ == 1 ? kEscape : bytes_.U8();
    return bytes_.Ok();
  }

  ByteReader bytes_;
  const bool encoded_;
  const uint64_t size_;
  std::vector<uint8_t> row_;
  uint64_t run_ = 0;  // remaining bytes of a run
  uint8_t value_ = 0;
};

// Converts the bytes of a row to the picture's.
using PutRow = void (*)(const uint8_t* source, size_t width, uint8_t* row);

void CopyBits(const uint8_t* source, size_t width, uint8_t* row) {
  std::memcpy(row, source, (width + 7) / 8);
}
void CopyBytes(const uint8_t* source, size_t width, uint8_t* row) {
  std::memcpy(row, source, width);
}
void CopyColors(const uint8_t* source, size_t width, uint8_t* row) {
  std::memcpy(row, source, 3 * width);
}
void DropFirst(const uint8_t* source, size_t width, uint8_t* row) {
  for (size_t x = 0; x < width; ++x, source += 4, row += 3) std::memcpy(row, source + 1, 3);
}
void DropFirstAndSwap(const uint8_t* source, size_t width, uint8_t* row) {
  for (size_t x = 0; x < width; ++x, source += 4, row += 3) {
    row[0] = source[3];
    row[1] = source[2];
    row[2] = source[1];
  }
}

PutRow ChooseRow(const RasHeader& header) {
  const bool redFirst = header.type == kRgb;
  switch (header.bits) {
    case 1: return CopyBits;
    case 8: return CopyBytes;
    case 24: return redFirst ? SwapColors : CopyColors;
    default: return redFirst ? DropFirstAndSwap : DropFirst;
  }
}

Status Decode(platform::FileView& file, const RasHeader& header, const PictureRecord& picture,
              PackedImage& image) {
  if (file.FileSize() < header.PixelOffset()) return Status::FileReadError;
  const auto pixels = file.Bytes().subspan(header.PixelOffset());
  // A run expands three bytes to at most 256.
  const uint64_t least = header.RowSize() * header.height / (header.type == kByteEncoded ? 86 : 1);
  if (pixels.size() < least) return Status::FileReadError;
  RETURN_IF_BAD(
      NewPackedImage(picture.width, picture.height, &picture.palette, picture.bitsPerPixel, image));
  RowSource source(pixels, header);
  const PutRow put = ChooseRow(header);
  for (int32_t y = 0; y < picture.height; ++y) {
    const auto row = source.Next();
    if (row.empty()) return Status::FileReadError;
    put(row.data(), header.width, image.Row(y).data());
    file.DropBefore(header.PixelOffset() + source.Position());
    RETURN_IF_BAD(picture.ReportRow(y));
  }
  return Status::Ok;
}

// File layout for a picture to write.
struct RasLayout {
  uint32_t bits = 24;
  bool map = false;
  bool invert = false;  // 1-bit pixels whose set bits are white
};

RasLayout ChooseLayout(const PictureRecord& picture) {
  const PackedImage& image = picture.image;
  if (image.Bits() == 24) return {};
  if (image.Bits() == 1) {
    const bool blackFirst = std::ranges::all_of(std::span(picture.palette).first(3),
                                                [](uint8_t v) { return v == 0; }) &&
                            std::ranges::all_of(std::span(picture.palette).subspan(3, 3),
                                                [](uint8_t v) { return v == 255; });
    if (blackFirst) return {1, false, true};
  }
  return {8, !(image.Bits() == 8 && picture.palette == GrayRamp()), false};
}

void WriteHead(ByteWriter& out, const PictureRecord& picture, const RasLayout& layout,
               uint64_t size) {
  const auto colors = static_cast<uint32_t>(layout.map ? picture.image.Colors() : 0);
  for (const uint32_t field :
       {kMagic, static_cast<uint32_t>(picture.image.Width()),
        static_cast<uint32_t>(picture.image.Height()), layout.bits, static_cast<uint32_t>(size),
        kStandard, layout.map ? kRgbMap : kNoMap, 3 * colors}) {
    out.Be32(field);
  }
  for (size_t c = 0; c < 3; ++c) {
    for (size_t i = 0; i < colors; ++i) out.U8(picture.palette[3 * i + c]);
  }
}

void MakeRow(const PackedImage& image, int32_t y, const RasLayout& layout,
             std::span<uint8_t> bytes) {
  const auto row = image.Row(y);
  if (layout.bits == 8 && image.Bits() < 8) {
    for (int32_t x = 0; x < image.Width(); ++x)
      bytes[static_cast<size_t>(x)] = static_cast<uint8_t>(image.PixelAt(x, y));
    return;
  }
  std::memcpy(bytes.data(), row.data(), std::min(bytes.size(), row.size()));
  if (layout.invert) {
    for (uint8_t& byte : bytes) byte = static_cast<uint8_t>(~byte);
  }
}

constexpr PlainCodec<RasHeader> kCodec = {kHeadSize, DescribePicture, Decode};

}  // namespace

Status RasInfo(PictureRecord& picture, const ReadRequest& request) {
  return PlainInfo(kCodec, picture, request);
}

Status RasRead(PictureRecord& picture, const ReadRequest& request) {
  return PlainRead(kCodec, picture, request);
}

Status RasWrite(PictureRecord& picture, const WriteOptions& options) {
  const ProgressScope progress(picture);
  const PackedImage& image = picture.image;
  if (image.Empty()) return Status::MemoryAllocationError;
  const RasLayout layout = ChooseLayout(picture);
  const uint64_t rowSize = (static_cast<uint64_t>(image.Width()) * layout.bits + 15) / 16 * 2;
  const uint64_t size = rowSize * static_cast<uint64_t>(image.Height());
  if (size > UINT32_MAX) return Status::UnsuitableImage;
  ByteWriter out;
  if (!out.Create(picture.fileName.c_str())) return Status::ErrorCreatingFile;
  WriteHead(out, picture, layout, size);
  std::vector<uint8_t> bytes(rowSize);
  for (int32_t y = 0; y < image.Height() && !out.Failed(); ++y) {
    RETURN_IF_BAD(picture.ReportRow(y));
    MakeRow(image, y, layout, bytes);
    out.Bytes(bytes);
  }
  return CommitOutput(out, options);
}

}  // namespace fotomill
