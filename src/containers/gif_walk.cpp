// A file is a header, a palette, blocks and a trailer:
//
//   offset size  field
//        0    6  "GIF87a" or "GIF89a"
//        6    4  width and height, little-endian
//       10    1  flags: 0x80 a palette follows, of 2 << (flags & 7) colors of 3 bytes
//       11    2  background, aspect ratio
//
// Blocks: 0x2C a picture (9 bytes with flags like those above in the last one, palette, one byte,
// parts), 0x21 an extension (label, parts), 0x3B the trailer. Parts are a size (1 byte) and so many
// bytes each; a size of 0 ends them. The first part of an application extension is its name, 11
// bytes.
//
// An XMP packet is not in parts. After it come 0x01, the bytes from 0xFF down to 0x00, and 0x00:
// wherever a reader that takes the packet for parts gets there, these lead it to the end.
// Sources: CompuServe, "Graphics Interchange Format, Version 89a" (1990); XMP specification part 3
// (2020), section 1.1.2.
#include "containers/gif_walk.h"

#include <algorithm>

#include "core/byte_reader.h"

namespace fotomill {

namespace {

constexpr uint8_t kImage = 0x2C, kExtension = 0x21, kTrailer = 0x3B;
constexpr size_t kHead = 13, kImageHead = 10;
constexpr uint8_t kNameSize = 11;
constexpr uint8_t kHasPalette = 0x80;
constexpr size_t kMagicSize = 258;  // behind a packet

uint64_t PaletteBytes(uint8_t flags) {
  return (flags & kHasPalette) != 0 ? uint64_t{6} << (flags & 7) : 0;
}

// The i-th byte behind a packet.
uint8_t MagicByte(size_t i) {
  if (i == 0) return 1;
  return i + 1 < kMagicSize ? static_cast<uint8_t>(kMagicSize - 2 - i) : 0;
}

}  // namespace

bool IsGifPictureExtension(uint8_t label, std::string_view application) {
  constexpr uint8_t kPlainText = 0x01, kGraphicControl = 0xF9;
  return label == kPlainText || label == kGraphicControl || application == "NETSCAPE2.0" ||
         application == "ANIMEXTS1.0";
}

GifWalk::GifWalk(std::span<const uint8_t> file) : file_(file) {
  ByteReader bytes(file);
  const bool gif = bytes.Match("GIF87a") || bytes.Match("GIF89a");
  if (!gif) outcome_ = Status::DamagedFile;
  next_ = gif && file.size() >= kHead ? kHead + PaletteBytes(file[10]) : file.size();
}

// Skips parts from `at` on, with the one of size 0.
bool GifWalk::SkipParts(uint64_t& at) const {
  while (at < file_.size()) {
    const uint8_t size = file_[at];
    at += uint64_t{1} + size;
    if (size == 0) return true;
  }
  return false;
}

bool GifWalk::Next(GifBlock& block) {
  if (next_ >= file_.size()) return false;
  block = {};
  const auto rest = file_.subspan(next_);
  uint64_t data = next_ + 2;
  if (rest[0] == kImage && rest.size() >= kImageHead) {
    data = next_ + kImageHead + PaletteBytes(rest[kImageHead - 1]) + 1;  // and the code size
  } else if (rest[0] == kExtension && rest.size() >= 2) {
    block.kind = GifBlock::Kind::Extension;
    block.label = rest[1];
    ByteReader bytes(rest.subspan(2));
    if (block.label == kGifApplicationLabel && bytes.U8() == kNameSize) {
      const auto name = bytes.Take(kNameSize);
      block.application = {static_cast<const char*>(static_cast<const void*>(name.data())),
                           name.size()};
      data += 1 + kNameSize;
    }
  } else {
    const bool cut = rest[0] == kImage || rest[0] == kExtension;
    outcome_ = rest[0] == kTrailer ? Status::Ok : cut ? Status::FileReadError : Status::DamagedFile;
    return false;
  }
  uint64_t end = data;
  if (!SkipParts(end)) return false;
  block.whole = file_.subspan(next_, end - next_);
  block.data = file_.subspan(data, end - data);
  next_ = end;
  return true;
}

std::span<const uint8_t> GifXmpPacket(const GifBlock& block) {
  if (block.application != kGifXmp || block.data.size() < kMagicSize) return {};
  const auto magic = block.data.last(kMagicSize);
  for (size_t i = 0; i < kMagicSize; ++i) {
    if (magic[i] != MagicByte(i)) return {};
  }
  return block.data.first(block.data.size() - kMagicSize);
}

std::vector<uint8_t> MakeGifXmp(std::span<const uint8_t> packet) {
  std::vector<uint8_t> block;
  block.reserve(3 + kNameSize + packet.size() + kMagicSize);
  for (const uint8_t byte : {kExtension, kGifApplicationLabel, kNameSize}) block.push_back(byte);
  for (const char letter : kGifXmp) block.push_back(static_cast<uint8_t>(letter));
  block.insert(block.end(), packet.begin(), packet.end());
  for (size_t i = 0; i < kMagicSize; ++i) block.push_back(MagicByte(i));
  return block;
}

}  // namespace fotomill
