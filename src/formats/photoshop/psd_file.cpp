// The layout of a Photoshop document (PSD, PDD), big-endian.
//
//   offset size  field
//        0    4  "8BPS"
//        4    2  version: 1; 2 is the large document (PSB)
//        6    6  unused
//       12    2  channels, 1 to 56
//       14    8  height, width
//       22    2  bits per sample: 1, 8, 16 or 32
//       24    2  mode: 0 bitmap, 1 gray, 2 indexed, 3 RGB, 4 CMYK, 7 multichannel, 8 duotone, 9 Lab
//       26    4  size of the color mode data, then these: the table of an indexed picture, 256
//                reds, greens and blues
//        .    4  size of the resources, then these: "8BIM", number (2), a counted text of even
//                length, size (4), data padded to an even length
//        .    4  size of the layer and mask section, then:
//             4  size of the layers, then: count (2), negative if the merged picture has opacity,
//                and per layer
//                  16  top, left, bottom, right
//                   2  channels, then 6 bytes each: number (2), data size (4)
//                  12  "8BIM", blend mode (4), opacity, clipping, flags, unused
//                   4  size of additional data, then these
//                followed by the data of all channels of all layers
//             4  size of the global mask, then the mask
//                blocks: "8BIM" or "8B64", key (4), size (4), data padded to 4; "Lr16" has the
//                layers of 16-bit documents
//        .       the merged picture: compression (2), all rows of the first channel, top first,
//                then of the next
//
// Compressions: 0 none, 1 PackBits, preceded by the sizes of all rows (2 each), 2 deflate, 3
// deflate of differences. Source: Adobe, "Adobe Photoshop File Formats Specification" (2019).
#include "formats/photoshop/psd_file.h"

#include <algorithm>
#include <cstdlib>

#include "core/byte_reader.h"

namespace fotomill {

namespace {

constexpr std::string_view kSignature = "8BPS", kBlock = "8BIM", kWideBlock = "8B64";
constexpr uint16_t kMostChannels = 56;
constexpr int32_t kLongestLayerSide = 300000;  // limit of large documents
constexpr size_t kColorTableSize = 768;
constexpr uint8_t kInkKind = 2;  // in the channel information

Status CheckHeader(const PsdHeader& header) {
  const bool oneBit = header.mode == PsdMode::Bitmap;
  if (header.width < 1 || header.height < 1) return Status::DamagedFile;
  if (header.channels < 1 || header.channels > kMostChannels) return Status::DamagedFile;
  if (header.depth == 32) return Status::UnsupportedFormat;
  if (header.depth != 1 && header.depth != 8 && header.depth != 16) return Status::DamagedFile;
  if (oneBit != (header.depth == 1)) return Status::DamagedFile;
  if (header.mode == PsdMode::Indexed && header.depth != 8) return Status::DamagedFile;
  constexpr PsdMode kModes[] = {PsdMode::Bitmap,  PsdMode::Gray, PsdMode::Indexed,
                                PsdMode::Rgb,     PsdMode::Cmyk, PsdMode::Multichannel,
                                PsdMode::Duotone, PsdMode::Lab};
  if (std::ranges::find(kModes, header.mode) == std::end(kModes)) return Status::UnsupportedFormat;
  return header.channels < PsdColorChannels(header) ? Status::DamagedFile : Status::Ok;
}

Status ParseHeader(ByteReader& bytes, PsdHeader& header) {
  if (!bytes.Match(kSignature))
    return bytes.Size() < 4 ? Status::FileReadError : Status::DamagedFile;
  const uint16_t version = bytes.Be16();
  bytes.Skip(6);
  header.channels = bytes.Be16();
  header.height = static_cast<int32_t>(bytes.Be32());
  header.width = static_cast<int32_t>(bytes.Be32());
  header.depth = bytes.Be16();
  header.mode = static_cast<PsdMode>(bytes.Be16());
  if (!bytes.Ok()) return Status::FileReadError;
  if (version == 2) return Status::UnsupportedFormat;
  return version == 1 ? CheckHeader(header) : Status::DamagedFile;
}

// Whether the first entry in a list of channel information is a spot color; `kindOffset` is the
// offset of the kind within an entry.
bool FirstIsInk(std::span<const uint8_t> list, size_t kindOffset) {
  return list.size() > kindOffset && list[kindOffset] == kInkKind;
}

void TakeResource(PsdResource number, std::span<const uint8_t> data, PsdFile& document) {
  ByteReader bytes(data);
  switch (number) {
    case PsdResource::Resolution: {
      const uint32_t x = bytes.Be32();
      bytes.Skip(4);
      const uint32_t y = bytes.Be32();
      if (!bytes.Ok()) return;
      document.dpiX = x / 65536.0;
      document.dpiY = y / 65536.0;
      return;
    }
    case PsdResource::ChannelInfo: document.firstExtraIsInk = FirstIsInk(data, 12); return;
    case PsdResource::ChannelInfoNew: document.firstExtraIsInk = FirstIsInk(data, 16); return;
    case PsdResource::IccProfile: document.icc = data; return;
    case PsdResource::Exif: document.exif = data; return;
    case PsdResource::Xmp: document.xmp = data; return;
    case PsdResource::TransparentIndex: {
      const uint16_t index = bytes.Be16();
      if (bytes.Ok() && index < 256 && document.header.mode == PsdMode::Indexed)
        document.transparentIndex = index;
      return;
    }
    case PsdResource::VersionInfo:
      if (data.size() > 4) document.mergedIsReal = data[4] != 0;
      return;
  }
}

// Stops at the first resource that does not fit; earlier ones are used.
void ParseResources(std::span<const uint8_t> section, PsdFile& document) {
  ByteReader bytes(section);
  while (bytes.Left() > 0) {
    bytes.Skip(4);  // "8BIM", or another signature with the same layout
    const auto number = static_cast<PsdResource>(bytes.Be16());
    bytes.Skip(bytes.U8() | 1u);
    const uint32_t size = bytes.Be32();
    const auto data = bytes.Take(size);
    if (!bytes.Ok()) return;
    TakeResource(number, data, document);
    if (size % 2 != 0 && bytes.Left() > 0) bytes.Skip(1);
  }
}

bool HoldsPixels(const PsdLayer& layer) {
  const int64_t width = int64_t{layer.right} - layer.left,
                height = int64_t{layer.bottom} - layer.top;
  return width > 0 && height > 0 && width <= kLongestLayerSide && height <= kLongestLayerSide;
}

// The layers of a section, without its length. Stops if the data do not fit.
void ParseLayers(std::span<const uint8_t> section, PsdFile& document) {
  ByteReader bytes(section);
  const auto count = static_cast<int16_t>(bytes.Be16());
  if (!bytes.Ok() || count == 0) return;
  document.mergedHasOpacity = count < 0;
  document.layerCount = static_cast<size_t>(std::abs(count));
  std::vector<PsdLayer> layers;
  std::vector<std::vector<uint32_t>> sizes;
  for (size_t i = 0; i < document.layerCount; ++i) {
    PsdLayer layer;
    for (int32_t* side : {&layer.top, &layer.left, &layer.bottom, &layer.right})
      *side = static_cast<int32_t>(bytes.Be32());
    const uint16_t channels = bytes.Be16();
    if (!bytes.Ok() || channels > kMostChannels) return;
    std::vector<uint32_t> ofChannels;
    for (uint16_t c = 0; c < channels; ++c) {
      layer.channels.push_back({static_cast<int16_t>(bytes.Be16()), {}});
      ofChannels.push_back(bytes.Be32());
    }
    bytes.Skip(12);
    bytes.Skip(bytes.Be32());
    if (!bytes.Ok()) return;
    layers.push_back(std::move(layer));
    sizes.push_back(std::move(ofChannels));
  }
  for (size_t i = 0; i < layers.size(); ++i) {
    for (size_t c = 0; c < sizes[i].size(); ++c)
      layers[i].channels[c].data = bytes.Take(sizes[i][c]);
  }
  if (!bytes.Ok()) return;
  std::erase_if(layers, [](const PsdLayer& layer) {
    return !HoldsPixels(layer) || layer.Channel(0) == nullptr;
  });
  document.layers = std::move(layers);
}

// The blocks after layers and global mask, which include the layers of 16-bit documents.
void ParseBlocks(ByteReader& bytes, PsdFile& document) {
  while (bytes.Left() >= 12) {
    if (!bytes.Match(kBlock) && !bytes.Match(kWideBlock)) return;
    const bool layers = bytes.Match("Lr16");
    const bool opacity = !layers && (bytes.Match("Mt16") || bytes.Match("Mtrn"));
    if (!layers && !opacity) bytes.Skip(4);
    const uint32_t size = bytes.Be32();
    const auto data = bytes.Take(size);
    if (!bytes.Ok()) return;
    if (layers && document.layerCount == 0) ParseLayers(data, document);
    if (opacity) document.mergedHasOpacity = true;
    bytes.Skip(std::min<uint64_t>((4 - size % 4) % 4, bytes.Left()));
  }
}

void ParseLayersAndMasks(std::span<const uint8_t> section, PsdFile& document) {
  ByteReader bytes(section);
  if (bytes.Left() < 4) return;
  const auto layers = bytes.Take(bytes.Be32());
  if (!bytes.Ok()) return;
  ParseLayers(layers, document);
  if (bytes.Left() < 4) return;
  bytes.Skip(bytes.Be32());
  if (bytes.Ok()) ParseBlocks(bytes, document);
}

}  // namespace

const PsdChannel* PsdLayer::Channel(int16_t number) const {
  const auto found = std::ranges::find(channels, number, &PsdChannel::number);
  return found == channels.end() ? nullptr : &*found;
}

uint16_t PsdColorChannels(const PsdHeader& header) {
  switch (header.mode) {
    case PsdMode::Rgb:
    case PsdMode::Lab: return 3;
    case PsdMode::Cmyk: return 4;
    case PsdMode::Multichannel:
      return header.channels < 3 ? 1 : std::min<uint16_t>(header.channels, 4);
    default: return 1;
  }
}

Status ParsePsd(std::span<const uint8_t> file, PsdFile& document) {
  ByteReader bytes(file);
  RETURN_IF_BAD(ParseHeader(bytes, document.header));
  document.colorTable = bytes.Take(bytes.Be32());
  const auto resources = bytes.Take(bytes.Be32());
  if (!bytes.Ok()) return Status::FileReadError;
  if (document.header.mode == PsdMode::Indexed && document.colorTable.size() < kColorTableSize)
    return Status::DamagedFile;
  ParseResources(resources, document);
  if (bytes.Left() == 0) return Status::Ok;  // a document without layers may end here
  const auto layers = bytes.Take(bytes.Be32());
  if (!bytes.Ok()) return Status::FileReadError;
  ParseLayersAndMasks(layers, document);
  if (bytes.Left() >= 2) document.merged = file.subspan(bytes.Position());
  return Status::Ok;
}

}  // namespace fotomill
