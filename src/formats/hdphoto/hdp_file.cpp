// The file and the codestream of HD Photo, also known as JPEG XR.
//
//   "II", BC, version 0 or 1, offset of the first directory; TIFF directories, little-endian
//
//   codestream, bits are most significant first:
//   "WMPHOTO" 0, version (4 bits: 1), subversion (4)
//   tiles (1), frequency order (1), rotation (3), index table (1), overlap (2)
//   short numbers (1), long words (1), window (1), trimmed (1), stretched tiles (1), red and blue
//   (1), premultiplied (1), alpha (1), colors (4), depth (4), width - 1, height - 1 (16 bits each
//   if short, else 32); with tiles: columns - 1, rows - 1 (12 each), the width of each column but
//   the last, the height of each row but the last, in blocks of 16 pixels (8 bits each if short,
//   else 16); with a window: hidden pixels above, left, below, right (6 each); byte-aligned plane:
//   internal colors (3), scaled (1), bands (4), color-specific fields, quantizers ...
// Source: ITU-T T.832 (2019), sections 8.3, 8.4 and annex A.
#include "formats/hdphoto/hdp_file.h"

#include <algorithm>
#include <bit>
#include <cstring>
#include <iterator>

#include "containers/exif_directories.h"
#include "core/byte_reader.h"

namespace fotomill {

namespace {

constexpr uint64_t kEntryBytes = 12;
// EXIF orientation by rotation value
constexpr uint8_t kOrientations[] = {1, 4, 2, 3, 6, 7, 5, 8};
// macroblock size in pixels
constexpr uint32_t kBlock = 16;
// internal color formats
constexpr uint32_t kYuv420 = 1, kYuv422 = 2, kYuv444 = 3, kCmyk = 4, kChannels = 6;

// Most significant bit first; past the end, bits are 0 and the reader is marked short.
class BitReader {
 public:
  explicit BitReader(ByteReader& bytes) : bytes_(bytes) {}
  uint32_t Take(unsigned count) {
    uint64_t value = 0;
    while (count > 0) {
      if (left_ == 0) {
        byte_ = bytes_.U8();
        left_ = 8;
      }
      const unsigned taken = count < left_ ? count : left_;
      value = value << taken | (byte_ >> (left_ - taken) & ((1u << taken) - 1));
      left_ -= taken;
      count -= taken;
    }
    return static_cast<uint32_t>(value);
  }
  bool Flag() { return Take(1) != 0; }
  void ToByte() { left_ = 0; }

 private:
  ByteReader& bytes_;
  uint32_t byte_ = 0;
  unsigned left_ = 0;
};

// The widths of all tile columns (or heights of all rows) but the last: each at least one block,
// with at least one block left for the last.
bool TakeTileSides(BitReader& bits, uint32_t count, unsigned width, uint32_t blocks) {
  uint64_t sum = 0;
  bool valid = true;
  for (uint32_t i = 1; i < count; ++i) {
    const uint32_t side = bits.Take(width);
    valid = valid && side > 0;
    sum += side;
  }
  return valid && (count == 1 || sum < blocks);
}

// The quantizers of one band; returns whether they are lossless.
bool TakeQuantizers(BitReader& bits, uint32_t channels) {
  // one for all, one for luma and one for chroma, or one for each channel
  const uint32_t mode = channels > 1 ? bits.Take(2) : 0;
  const uint32_t count = mode == 0 ? 1 : mode == 1 ? 2 : channels;
  bool lossless = true;
  for (uint32_t i = 0; i < count; ++i) lossless = bits.Take(8) <= 1 && lossless;
  return lossless;
}

void ParsePlane(BitReader& bits, HdpStream& stream) {
  const uint32_t colors = bits.Take(3);
  const bool scaled = bits.Flag();  // coded with extra bits, losing the lowest ones
  const uint32_t bands = bits.Take(4);
  uint32_t channels = colors == kCmyk ? 4 : colors == 0 ? 1 : 3;
  if (colors == kYuv420 || colors == kYuv422 || colors == kYuv444) bits.Take(8);
  if (colors == kChannels) {
    channels = bits.Take(4) + 1;
    bits.Take(4);
  }
  switch (stream.depth) {
    case HdpDepth::U16:
    case HdpDepth::Fixed16:
    case HdpDepth::U32:
    case HdpDepth::Fixed32: bits.Take(8); break;
    case HdpDepth::Float: bits.Take(16); break;
    default: break;
  }
  bool lossless = bands == 0 && !scaled && bits.Flag() && TakeQuantizers(bits, channels);
  // low and high frequencies, unless they reuse the previous quantizers
  for (int band = 0; band < 2; ++band) {
    if (lossless && !bits.Flag()) lossless = bits.Flag() && TakeQuantizers(bits, channels);
  }
  stream.internalColors = static_cast<uint8_t>(colors);
  stream.lossless = lossless;
}

bool IsKnown(HdpColors colors, HdpDepth depth) {
  return colors <= HdpColors::Rgbe && (depth <= HdpDepth::Rgb565 || depth == HdpDepth::BlackIsOne);
}

struct HdpEntry {
  uint16_t tag = 0, type = 0;
  uint32_t count = 0, value = 0;
  uint64_t place = 0;  // offset of an inline value
};

HdpEntry TakeEntry(ByteReader& bytes) {
  HdpEntry entry;
  entry.tag = bytes.Le16();
  entry.type = bytes.Le16();
  entry.count = bytes.Le32();
  entry.place = bytes.Position();
  entry.value = bytes.Le32();
  if (entry.type == 3) entry.value &= 0xFFFF;
  if (entry.type == kHdpByte) entry.value &= 0xFF;
  return entry;
}

// The bytes of a byte-typed entry; empty if they are outside the file.
std::span<const uint8_t> BytesOf(std::span<const uint8_t> file, const HdpEntry& entry) {
  const uint64_t offset = entry.count <= 4 ? entry.place : entry.value;
  return offset <= file.size() && entry.count <= file.size() - offset
             ? file.subspan(offset, entry.count)
             : std::span<const uint8_t>();
}

// Moves the reader to the directory of a page, after its count; 0 if it does not exist.
uint16_t FindDirectory(ByteReader& bytes, int32_t page) {
  if (!bytes.Match("II\xBC") || bytes.U8() > 1) return 0;
  for (int32_t i = 0;; ++i) {
    const uint32_t offset = bytes.Le32();
    if (offset == 0) return 0;
    bytes.Seek(offset);
    const uint16_t count = bytes.Le16();
    if (i == page || !bytes.Ok()) return bytes.Ok() ? count : uint16_t{0};
    bytes.Skip(count * kEntryBytes);
  }
}

struct Extent {
  uint32_t offset = 0, size = 0;
};

// Cut at the end of the file: some writers store wrong sizes, and the decoder reports
// missing data itself.
std::span<const uint8_t> Part(std::span<const uint8_t> file, const Extent& extent) {
  if (extent.offset == 0 || extent.offset >= file.size()) return {};
  const auto rest = file.subspan(extent.offset);
  return extent.size == 0 || extent.size > rest.size() ? rest : rest.first(extent.size);
}

}  // namespace

Status ParseHdpStream(std::span<const uint8_t> data, HdpStream& stream) {
  ByteReader bytes(data);
  stream = {};
  stream.bytes = data;
  if (!bytes.Match(std::string_view("WMPHOTO\0", 8)))
    return data.size() < 8 ? Status::FileReadError : Status::DamagedFile;
  BitReader bits(bytes);
  const uint32_t version = bits.Take(4), subversion = bits.Take(4);
  const bool tiled = bits.Flag();
  stream.frequencyOrder = bits.Flag();
  bits.Take(3);
  const bool indexed = bits.Flag();
  const uint32_t overlap = bits.Take(2);
  const bool shortNumbers = bits.Flag();
  bits.Take(1);
  const bool window = bits.Flag();
  bits.Take(1);
  const bool stretched = bits.Flag();
  bits.Take(1);
  stream.multiplied = bits.Flag();
  stream.alpha = bits.Flag();
  stream.colors = static_cast<HdpColors>(bits.Take(4));
  stream.depth = static_cast<HdpDepth>(bits.Take(4));
  const uint64_t width = uint64_t{bits.Take(shortNumbers ? 16 : 32)} + 1;
  const uint64_t height = uint64_t{bits.Take(shortNumbers ? 16 : 32)} + 1;
  const uint32_t columns = tiled ? bits.Take(12) + 1 : 1, rows = tiled ? bits.Take(12) + 1 : 1;
  if (!bytes.Ok()) return Status::FileReadError;
  const bool known = version == 1 && (subversion == 0 || subversion == 1 || subversion == 9) &&
                     overlap < 3 && !stretched;
  if (!known || !IsKnown(stream.colors, stream.depth)) return Status::UnsupportedFormat;
  if (width > INT32_MAX || height > INT32_MAX) return Status::DamagedFile;
  if (!indexed && (stream.frequencyOrder || columns * rows > 1)) return Status::DamagedFile;
  const unsigned sideBits = shortNumbers ? 8 : 16;
  const bool fit =
      TakeTileSides(bits, columns, sideBits,
                    static_cast<uint32_t>((width + kBlock - 1) / kBlock)) &&
      TakeTileSides(bits, rows, sideBits, static_cast<uint32_t>((height + kBlock - 1) / kBlock));
  if (window) bits.Take(24);
  bits.ToByte();
  stream.width = static_cast<int32_t>(width);
  stream.height = static_cast<int32_t>(height);
  stream.overlap = static_cast<uint8_t>(overlap);
  stream.tiles = columns * rows;
  ParsePlane(bits, stream);
  if (!bytes.Ok()) return Status::FileReadError;
  return fit ? Status::Ok : Status::DamagedFile;
}

uint16_t OrientationOfTurn(uint32_t turn) { return kOrientations[turn & 7]; }

uint32_t HdpTurn(uint16_t orientation) {
  const auto found = std::find(std::begin(kOrientations), std::end(kOrientations), orientation);
  return found == std::end(kOrientations) ? 0 : static_cast<uint32_t>(found - kOrientations);
}

int32_t CountHdpPages(std::span<const uint8_t> file) {
  ByteReader bytes(file);
  if (!bytes.Match("II\xBC") || bytes.U8() > 1) return 0;
  int32_t pages = 0;
  for (uint32_t offset = bytes.Le32(); offset != 0 && bytes.Ok() && pages < kMostHdpPages;
       ++pages) {
    bytes.Seek(offset);
    const uint16_t count = bytes.Le16();
    bytes.Skip(count * kEntryBytes);
    const bool whole = bytes.Ok();
    // some writers omit the last link
    const uint32_t next = bytes.Left() >= 4 ? bytes.Le32() : 0;
    if (!whole) break;
    offset = next > offset ? next : 0;  // links backward could form a loop
  }
  return pages;
}

Status ParseHdpPage(std::span<const uint8_t> file, int32_t page, HdpPage& result) {
  ByteReader bytes(file);
  result = {};
  if (file.size() >= 4 && (std::memcmp(file.data(), "II\xBC", 3) != 0 || file[3] > 1))
    return Status::DamagedFile;
  const uint16_t count = FindDirectory(bytes, page);
  if (!bytes.Ok() || file.size() < 8) return Status::FileReadError;
  if (count == 0) return page == 0 ? Status::DamagedFile : Status::NoImages;
  result.directory = bytes.Position() - 2;
  Extent image, alpha;
  for (uint16_t i = 0; i < count; ++i) {
    const HdpEntry entry = TakeEntry(bytes);
    switch (entry.tag) {
      case kHdpPixelFormat:
        if (const auto guid = BytesOf(file, entry); guid.size() == 16)
          std::memcpy(result.pixelFormat.data(), guid.data(), 16);
        break;
      case kHdpOrientation: result.turn = entry.value & 7; break;
      case kHdpDpiX: result.dpiX = std::bit_cast<float>(entry.value); break;
      case kHdpDpiY: result.dpiY = std::bit_cast<float>(entry.value); break;
      case kHdpImageOffset: image.offset = entry.value; break;
      case kHdpImageSize: image.size = entry.value; break;
      case kHdpAlphaOffset: alpha.offset = entry.value; break;
      case kHdpAlphaSize: alpha.size = entry.value; break;
      case kHdpIcc: result.icc = BytesOf(file, entry); break;
      case kHdpXmp: result.xmp = BytesOf(file, entry); break;
      case kHdpDescription: result.description = BytesOf(file, entry); break;
      default: break;
    }
  }
  if (!bytes.Ok()) return Status::FileReadError;
  if (image.offset == 0) return Status::DamagedFile;
  // The alpha size may wrongly be counted from the start of the file, a common error of writers.
  result.cutShort = uint64_t{image.offset} + image.size > file.size() || alpha.size > file.size();
  RETURN_IF_BAD(ParseHdpStream(Part(file, image), result.image));
  if (alpha.offset == 0) return Status::Ok;
  RETURN_IF_BAD(ParseHdpStream(Part(file, alpha), result.alpha));
  const bool matches =
      result.alpha.width == result.image.width && result.alpha.height == result.image.height &&
      result.alpha.depth == result.image.depth && result.alpha.colors == HdpColors::Gray;
  return matches ? Status::Ok : Status::DamagedFile;
}

std::vector<uint8_t> HdpExifBlock(std::span<const uint8_t> file, const HdpPage& page) {
  ExifDirectories directories = GatherExif(file, {}, page.directory);
  SetOrientation(directories, OrientationOfTurn(page.turn));
  return MakePictureBlock(std::move(directories));
}

}  // namespace fotomill
