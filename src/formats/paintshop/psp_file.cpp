// The layout of a Paint Shop Pro image (PSP), little-endian.
//
//   offset size  field
//        0   32  "Paint Shop Pro Image File\n", 1A, zeros
//       32    4  version: major, minor; 3 is Paint Shop Pro 5, 4 is 6, 5 is 7, 6 is 8
//       36       blocks: "~BK", 0, number (2), in version 3 the size of the first part (4), total
//                size (4), data; later versions have the size of a part, including itself (4), at
//                the start of each part
//
//   0 image: width, height (4 each), resolution (8), its unit (1: 1 inches, 2 centimeters),
//     compression (2: 0 none, 1 run-length, 2 deflate, 3 JPEG), bits per pixel (2), planes (2),
//     colors (4), gray (1), ...
//   2 palette: entries (4), then blue, green, red, 0 each
//   3 layers: a block 4 for each, from the bottom up
//   4 layer: name (version 3: 256 bytes, later: length (2) and text), kind (1), rectangle of the
//   image
//     and of the saved part (left, top, right, bottom, 4 each), opacity, blend mode, visible (1
//     each), ..., bitmaps, channels (2 each; later in a separate part), then a block 5 for each
//     channel
//   5 channel: compressed and uncompressed size (4 each), bitmap (2: 0 image, 1 transparency),
//   color
//     (2: 0 all in one, 1 red, 2 green, 3 blue), data
//   16 composites: blocks 17 with width, height (4 each), bits, compression, planes (2 each),
//   colors
//     (4), kind (2: 0 the whole picture, 1 a thumbnail), then in that order blocks 9 with bitmaps,
//     channels (2 each) and blocks 5, or blocks 18 of JPEG
//
// A run-length token is a count and that many literal bytes, or a count above 128 and one byte that
// is repeated count - 128 times. Source: Jasc Software, "Paint Shop Pro (PSP) File Format
// Specification", versions 3.0 to 6.0 (1998 to 2003).
#include "formats/paintshop/psp_file.h"

#include <algorithm>
#include <bit>
#include <string_view>

#include "core/byte_reader.h"

namespace fotomill {

namespace {

constexpr std::string_view kSignature = "Paint Shop Pro Image File\n\x1a";
constexpr uint64_t kHeaderSize = 36;
constexpr size_t kMostLayers = 10000, kMostChannels = 64;
enum Block : uint16_t {
  Image = 0,
  Colors = 2,
  Layers = 3,
  Layer = 4,
  Channel = 5,
  Composite = 9,
  Composites = 16,
  CompositeFacts = 17,
  JpegComposite = 18
};

struct BlockView {
  uint16_t number = 0;
  uint32_t firstPart = 0;  // bytes
  std::span<const uint8_t> data;
};

// The next block, cut at the end of the file. False at the end.
bool NextBlock(ByteReader& bytes, uint16_t version, BlockView& block) {
  if (!bytes.Match(std::string_view("~BK\0", 4))) return false;
  block.number = bytes.Le16();
  if (version < 4) block.firstPart = bytes.Le32();
  const uint64_t size = bytes.Le32();
  if (!bytes.Ok()) return false;
  block.data = bytes.Take(std::min(size, bytes.Left()));
  if (version >= 4) block.firstPart = ByteReader(block.data).Le32();
  return true;
}

// A reader for a block's first part, after its size.
ByteReader FirstPart(const BlockView& block, uint16_t version) {
  ByteReader bytes(block.data);
  if (version >= 4) bytes.Skip(4);
  return bytes;
}

std::span<const uint8_t> BehindFirstPart(const BlockView& block) {
  return block.data.subspan(std::min<size_t>(block.firstPart, block.data.size()));
}

void TakeImage(ByteReader bytes, PspFile& psp) {
  psp.width = static_cast<int32_t>(bytes.Le32());
  psp.height = static_cast<int32_t>(bytes.Le32());
  const auto resolution = std::bit_cast<double>(bytes.Le64());
  const uint8_t metric = bytes.U8();
  psp.compression = static_cast<PspCompression>(bytes.Le16());
  psp.bits = bytes.Le16();
  bytes.Skip(2 + 4);
  psp.gray = bytes.U8() != 0;
  if (!bytes.Ok()) psp.width = 0;
  if (resolution > 0 && resolution < 1e6 && metric > 0)
    psp.dpi = metric == 2 ? resolution * 2.54 : resolution;
}

void TakeColors(ByteReader bytes, PspFile& psp) {
  const uint32_t count = bytes.Le32();
  for (size_t i = 0; i < std::min<size_t>(count, 256); ++i) {
    for (size_t c = 0; c < 3; ++c) psp.palette[3 * i + 2 - c] = bytes.U8();
    bytes.Skip(1);
  }
  psp.hasPalette = bytes.Ok() && count > 0;
}

// Collects the channels stored in blocks.
void TakeChannels(std::span<const uint8_t> data, uint16_t version, PspLayer& layer) {
  ByteReader bytes(data);
  BlockView block;
  while (layer.channels.size() < kMostChannels && NextBlock(bytes, version, block)) {
    if (block.number != Channel) continue;
    ByteReader part = FirstPart(block, version);
    PspChannel channel;
    const uint32_t stored = part.Le32();
    channel.size = part.Le32();
    channel.bitmap = static_cast<PspBitmap>(part.Le16());
    channel.color = static_cast<PspColor>(part.Le16());
    if (!part.Ok()) return;
    const auto code = BehindFirstPart(block);
    channel.data = code.first(std::min<size_t>(stored, code.size()));
    layer.channels.push_back(channel);
  }
}

Rectangle TakeRectangle(ByteReader& bytes) {
  int64_t sides[4];
  for (int64_t& side : sides) side = static_cast<int32_t>(bytes.Le32());
  const auto length = [](int64_t from, int64_t to) {
    return static_cast<int32_t>(std::clamp<int64_t>(to - from, 0, INT32_MAX));
  };
  return {static_cast<int32_t>(sides[0]), static_cast<int32_t>(sides[1]),
          length(sides[0], sides[2]), length(sides[1], sides[3])};
}

void TakeLayer(const BlockView& block, PspFile& psp) {
  ByteReader bytes = FirstPart(block, psp.version);
  bytes.Skip(psp.version < 4 ? 256 : bytes.Le16());
  bytes.Skip(1);
  const Rectangle image = TakeRectangle(bytes);
  PspLayer layer;
  layer.place = TakeRectangle(bytes);
  layer.bits = psp.bits;
  layer.compression = psp.compression;
  layer.opacity = bytes.U8();
  layer.blendMode = bytes.U8();
  layer.visible = (bytes.U8() & 1) != 0;
  if (!bytes.Ok()) return;
  if (layer.place.width == 0) layer.place = image;
  std::span<const uint8_t> channels = BehindFirstPart(block);
  if (psp.version >= 4)
    channels = channels.subspan(std::min<size_t>(ByteReader(channels).Le32(), channels.size()));
  TakeChannels(channels, psp.version, layer);
  if (layer.HasPixels() && layer.place.width > 0 && layer.place.height > 0) {
    psp.layers.push_back(std::move(layer));
  } else {
    ++psp.otherLayers;
  }
}

void TakeLayers(std::span<const uint8_t> data, PspFile& psp) {
  ByteReader bytes(data);
  BlockView block;
  while (psp.layers.size() < kMostLayers && NextBlock(bytes, psp.version, block)) {
    if (block.number == Layer) TakeLayer(block, psp);
  }
}

// Uses the composite of the whole picture, if it is lossless.
void TakeComposites(const BlockView& bank, PspFile& psp) {
  ByteReader bytes(BehindFirstPart(bank));
  BlockView block;
  std::vector<PspLayer> whole;  // facts of each composite; empty rectangles for thumbnails
  size_t index = 0;
  while (NextBlock(bytes, psp.version, block)) {
    ByteReader part = FirstPart(block, psp.version);
    if (block.number == CompositeFacts && whole.size() < kMostLayers) {
      PspLayer layer;
      layer.place.width = static_cast<int32_t>(part.Le32());
      layer.place.height = static_cast<int32_t>(part.Le32());
      layer.bits = part.Le16();
      layer.compression = static_cast<PspCompression>(part.Le16());
      part.Skip(2 + 4);
      if (part.Le16() != 0 || !part.Ok()) layer.place = {};
      whole.push_back(std::move(layer));
    } else if (block.number == JpegComposite) {
      ++index;
    } else if (block.number == Composite && index < whole.size()) {
      PspLayer& layer = whole[index++];
      if (layer.place.width != psp.width || layer.place.height != psp.height ||
          layer.bits != psp.bits)
        continue;
      TakeChannels(BehindFirstPart(block), psp.version, layer);
      if (layer.HasPixels()) psp.composite = std::move(layer);
    }
  }
}

}  // namespace

const PspChannel* PspLayer::Channel(PspBitmap bitmap, PspColor color) const {
  const auto fits = [&](const PspChannel& channel) {
    return channel.bitmap == bitmap && channel.color == color;
  };
  const auto found = std::ranges::find_if(channels, fits);
  return found == channels.end() ? nullptr : &*found;
}

bool PspLayer::HasPixels() const {
  const auto has = [this](PspColor color) { return Channel(PspBitmap::Image, color) != nullptr; };
  return has(PspColor::Composite) ||
         (has(PspColor::Red) && has(PspColor::Green) && has(PspColor::Blue));
}

Status ParsePsp(std::span<const uint8_t> file, PspFile& psp) {
  ByteReader bytes(file);
  if (!bytes.Match(kSignature))
    return file.size() < kSignature.size() ? Status::FileReadError : Status::DamagedFile;
  bytes.Seek(kHeaderSize - 4);
  psp.version = bytes.Le16();
  bytes.Skip(2);
  if (!bytes.Ok()) return Status::FileReadError;
  if (psp.version < 3) return Status::UnsupportedFormat;
  BlockView block, composites;
  while (NextBlock(bytes, psp.version, block)) {
    if (block.number == Image) TakeImage(FirstPart(block, psp.version), psp);
    if (block.number == Colors) TakeColors(FirstPart(block, psp.version), psp);
    if (block.number == Layers) TakeLayers(block.data, psp);
    if (block.number == Composites) composites = block;
  }
  TakeComposites(composites, psp);
  if (psp.width < 1 || psp.height < 1) return Status::DamagedFile;
  constexpr int32_t kDepths[] = {1, 4, 8, 16, 24, 48};
  return std::ranges::find(kDepths, psp.bits) == std::end(kDepths) ? Status::UnsupportedFormat
                                                                   : Status::Ok;
}

}  // namespace fotomill
