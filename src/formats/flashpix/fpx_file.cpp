// The layout of FlashPix files (FPX), little-endian: a compound file with
//
//   Data Object Store 000001   the picture; for a view with changes, referenced by a transform
//     \5Image Contents         a property set: sizes, colors, JPEG tables
//     Resolution 0000 ...      smallest first, each half the size of the next
//       Subimage 0000 Header
//       Subimage 0000 Data
//
// Property set: FFFE, version and system (6 more bytes), a class id (16), the number of sections
// (4), then for the first one its class id (16) and offset (4). Section: its length, the number of
// properties, and for each its number and offset in the section; at that offset a type (4 bytes)
// and the value. Relevant properties, all but the first with the index of a size or table in their
// third byte:
//
//   01000000   number of sizes                     type 19, 4 bytes
//   01000002   width and, as 01000003, height      the same
//   02nn0002   colors                              type 65: length, then: pictures, channels (4
//                                                  bytes each), and for each channel a number: the
//                                                  color space in bits 16 to 30, opacity flag in
//                                                  bit 15; 7FFE in the lower bits: opacity channel
//   03nn0001   JPEG tables                         type 65: length, an abbreviated stream
//
// Header of the tiles, after 28 bytes:
//
//        0    4  its length
//        4    8  width, height
//       12    4  number of tiles
//       16    8  width and height of a tile, 64
//       24    4  channels
//       28    8  offset of the tile table, size of its entries, 16
//                entry: offset of the data relative to byte 28 of their stream, length, compression
//                and its subtype, 4 bytes each
//
// Tiles at the right and bottom edge are complete; pixels outside of the picture are ignored.
// Source: Digital Imaging Group, FlashPix Format Specification 1.0.2 (1998).
#include "formats/flashpix/fpx_file.h"

#include <algorithm>
#include <cstdio>

#include "core/byte_reader.h"

namespace fotomill {

namespace {

constexpr uint64_t kStreamHead = 28;
constexpr uint32_t kNumber = 19, kBlob = 65;
constexpr uint32_t kSizes = 0x01000000, kWidth = 0x01000002, kHeight = 0x01000003;
constexpr int32_t kMostSizes = 32, kMostTileSide = 4096;
constexpr uint64_t kMostContents = 4 << 20;
constexpr uint32_t kOpacity = 0x7FFE;

std::vector<uint8_t> WholeStream(const CompoundFile& compound, int32_t entry, uint64_t most) {
  const CompoundStream stream = compound.Stream(entry);
  std::vector<uint8_t> gathered;
  const auto bytes = stream.Bytes(0, std::min(stream.Size(), most), gathered);
  return {bytes.begin(), bytes.end()};
}

std::span<const uint8_t> Blob(std::span<const uint8_t> value) {
  ByteReader bytes(value);
  if (bytes.Le32() != kBlob) return {};
  const uint32_t length = bytes.Le32();
  return bytes.Take(length);
}

// The channels' colors, all in one color space.
Status ParseColors(std::span<const uint8_t> blob, FpxSize& size) {
  ByteReader bytes(blob);
  bytes.Skip(4);
  const uint32_t channels = bytes.Le32();
  if (!bytes.Ok() || channels < 1) return Status::DamagedFile;
  if (channels > 4) return Status::UnsupportedFormat;
  size.channels = static_cast<int32_t>(channels);
  for (uint32_t i = 0; i < channels; ++i) {
    const uint32_t color = bytes.Le32() & 0x7FFFFFFF;
    if (i == 0) size.colors = static_cast<FpxColors>(color >> 16);
    if ((color & 0x7FFF) == kOpacity) {
      if (i + 1 != channels || i == 0) return Status::UnsupportedFormat;
      size.opacity = true;
    }
  }
  if (!bytes.Ok()) return Status::DamagedFile;
  const int32_t colors = size.channels - (size.opacity ? 1 : 0);
  const bool gray = size.colors == FpxColors::Gray && colors == 1;
  const bool color =
      (size.colors == FpxColors::PhotoYcc || size.colors == FpxColors::Rgb) && colors == 3;
  return gray || color ? Status::Ok : Status::UnsupportedFormat;
}

// The tile table; its length is determined by the picture size, whatever the file says.
Status ParseTiles(std::span<const uint8_t> header, FpxSize& size) {
  ByteReader bytes(header);
  bytes.Skip(kStreamHead + 12);
  const uint32_t count = bytes.Le32(), tileWidth = bytes.Le32(), tileHeight = bytes.Le32();
  const uint32_t channels = bytes.Le32(), list = bytes.Le32(), each = bytes.Le32();
  if (!bytes.Ok()) return Status::FileReadError;
  if (tileWidth < 1 || tileHeight < 1 || tileWidth > kMostTileSide || tileHeight > kMostTileSide ||
      each < 16)
    return Status::DamagedFile;
  if (channels != static_cast<uint32_t>(size.channels)) return Status::DamagedFile;
  size.tileWidth = static_cast<int32_t>(tileWidth);
  size.tileHeight = static_cast<int32_t>(tileHeight);
  const uint64_t needed =
      static_cast<uint64_t>(size.TilesAcross()) * static_cast<uint64_t>(size.TilesDown());
  if (count < needed) return Status::DamagedFile;
  if (header.size() / each < needed) return Status::FileReadError;
  size.tiles.reserve(needed);
  for (uint64_t i = 0; i < needed; ++i) {
    bytes.Seek(kStreamHead + list + i * each);
    FpxTile tile;
    tile.offset = kStreamHead + bytes.Le32();
    tile.size = bytes.Le32();
    tile.compression = bytes.Le32();
    tile.subtype = bytes.Le32();
    size.tiles.push_back(tile);
  }
  return bytes.Ok() ? Status::Ok : Status::FileReadError;
}

}  // namespace

Status FpxFile::ParseContents() {
  ByteReader set(contents_);
  set.Seek(kStreamHead + 16);
  const uint32_t section = set.Le32();
  set.Seek(section);
  const auto bytes = set.Peek(set.Left());
  set.Skip(4);
  const uint32_t count = set.Le32();
  if (!set.Ok()) return Status::FileReadError;
  for (uint32_t i = 0; i < count && set.Left() >= 8; ++i) {
    const uint32_t number = set.Le32(), offset = set.Le32();
    if (offset < bytes.size()) properties_.emplace(number, bytes.subspan(offset));
  }
  const auto number = [&](uint32_t property) {
    const auto found = properties_.find(property);
    if (found == properties_.end()) return 0;
    ByteReader value(found->second);
    const uint32_t type = value.Le32(), result = value.Le32();
    return type == kNumber && result <= INT32_MAX ? static_cast<int32_t>(result) : 0;
  };
  sizes_ = number(kSizes);
  width_ = number(kWidth);
  height_ = number(kHeight);
  return sizes_ < 1 || sizes_ > kMostSizes || width_ < 1 || height_ < 1 ? Status::DamagedFile
                                                                        : Status::Ok;
}

Status FpxFile::Open(std::span<const uint8_t> file) {
  RETURN_IF_BAD(compound_.Open(file));
  store_ = compound_.FindBeginning(CompoundFile::kRoot, "Data Object Store");
  transform_ = compound_.FindBeginning(CompoundFile::kRoot, "\5Transform") != CompoundFile::kNone;
  const int32_t contents = compound_.Find(store_, "\5Image Contents");
  if (contents == CompoundFile::kNone) return Status::DamagedFile;
  contents_ = WholeStream(compound_, contents, kMostContents);
  return ParseContents();
}

Status FpxFile::ReadSize(int32_t index, bool withTiles, FpxSize& size) const {
  const uint32_t bits = static_cast<uint32_t>(index) << 16;
  const auto colors = properties_.find(0x02000002 | bits);
  if (colors == properties_.end()) return Status::DamagedFile;
  RETURN_IF_BAD(ParseColors(Blob(colors->second), size));
  char name[32];
  std::snprintf(name, sizeof name, "Resolution %04d", index);
  const int32_t storage = compound_.Find(store_, name);
  const int32_t entry = compound_.Find(storage, "Subimage 0000 Header");
  if (entry == CompoundFile::kNone) return Status::DamagedFile;
  const CompoundStream stream = compound_.Stream(entry);
  std::vector<uint8_t> gathered;
  const auto header = stream.Bytes(0, stream.Size(), gathered);
  ByteReader bytes(header);
  bytes.Skip(kStreamHead + 4);
  const uint32_t width = bytes.Le32(), height = bytes.Le32();
  if (!bytes.Ok()) return Status::FileReadError;
  if (width < 1 || height < 1 || width > INT32_MAX || height > INT32_MAX)
    return Status::DamagedFile;
  size.width = static_cast<int32_t>(width);
  size.height = static_cast<int32_t>(height);
  if (!withTiles) return Status::Ok;
  RETURN_IF_BAD(ParseTiles(header, size));
  size.data = compound_.Stream(compound_.Find(storage, "Subimage 0000 Data"));
  return Status::Ok;
}

std::span<const uint8_t> FpxFile::JpegTables(uint32_t number) const {
  const auto found = properties_.find(0x03000001 | number << 16);
  return found == properties_.end() ? std::span<const uint8_t>() : Blob(found->second);
}

}  // namespace fotomill
