#include "formats/gif/gif_blocks.h"

#include <string_view>

#include "core/limits.h"
#include "formats/gif/gif_lzw.h"

namespace fotomill {

using namespace gif;

namespace {

constexpr uint64_t kMostPixelsPerByte = 4096;  // more than LZW with 12-bit codes can reach

GifPalette ReadPalette(ByteReader& bytes, uint8_t flags) {
  if ((flags & 0x80) == 0) return {};
  const int32_t bits = (flags & 7) + 1;
  return {bytes.Take(uint64_t{3} << bits), bits};
}

void SkipSubBlocks(ByteReader& bytes) {
  for (uint8_t size = bytes.U8(); size != 0; size = bytes.U8()) bytes.Skip(size);
}

// The contents of an extension's sub-blocks.
std::vector<uint8_t> TakeSubBlocks(ByteReader& bytes, uint64_t most) {
  std::vector<uint8_t> text;
  for (uint8_t size = bytes.U8(); size != 0; size = bytes.U8()) {
    const auto piece = bytes.Take(size);
    if (text.size() + piece.size() <= most) text.insert(text.end(), piece.begin(), piece.end());
  }
  return text;
}

void ParseGraphicControl(ByteReader& bytes, GifFrame& frame) {
  const auto block = bytes.Take(bytes.U8());
  if (block.size() >= 4) {
    frame.disposal = block[0] >> 2 & 7;
    frame.delay = static_cast<uint16_t>(block[1] | block[2] << 8);
    frame.transparent = (block[0] & 1) != 0 ? block[3] : kNoIndex;
  }
  if (!block.empty()) SkipSubBlocks(bytes);
}

void ParseFrame(ByteReader& bytes, GifScreen& screen, GifFrame& frame) {
  frame.left = bytes.Le16();
  frame.top = bytes.Le16();
  frame.width = bytes.Le16();
  frame.height = bytes.Le16();
  const uint8_t flags = bytes.U8();
  frame.interlaced = (flags & 0x40) != 0;
  frame.palette = ReadPalette(bytes, flags);
  if (frame.palette.bits == 0) frame.palette = screen.palette;
  frame.dataOffset = bytes.Position();
  frame.pixelBits = bytes.U8();
  // a screen without size is as large as its picture
  if (screen.width == 0) screen.width = frame.left + frame.width;
  if (screen.height == 0) screen.height = frame.top + frame.height;
}

// The number of loops: an application block introduced by one browser and now used by all programs;
// sub-block 1 has the number of repetitions.
void ParseApplication(ByteReader& bytes, GifRemarks& remarks) {
  const auto name = bytes.Take(bytes.U8());
  const auto is = [&](std::string_view text) { return std::ranges::equal(name, text); };
  const bool loops = is("NETSCAPE2.0") || is("ANIMEXTS1.0");
  for (uint8_t size = name.empty() ? 0 : bytes.U8(); size != 0; size = bytes.U8()) {
    const auto block = bytes.Take(size);
    if (!loops || block.size() < 3 || block[0] != 1) continue;
    remarks.loops = true;
    remarks.repeats = static_cast<uint16_t>(block[1] | block[2] << 8);
  }
}

}  // namespace

Status ParseScreen(ByteReader& bytes, GifScreen& screen) {
  if (bytes.Match("GIF89a")) {
    screen.is89 = true;
  } else if (!bytes.Match("GIF87a")) {
    return Status::DamagedFile;
  }
  screen.width = bytes.Le16();
  screen.height = bytes.Le16();
  const uint8_t flags = bytes.U8();
  bytes.Skip(2);
  screen.palette = ReadPalette(bytes, flags);
  return bytes.Ok() ? Status::Ok : Status::FileReadError;
}

Status NextFrame(ByteReader& bytes, GifScreen& screen, GifFrame& frame, GifRemarks* remarks) {
  frame = {};
  uint64_t garbage = 0;
  while (bytes.Left() > 0) {
    const uint8_t block = bytes.U8();
    if (block == kEndBlock) return Status::NoImages;
    if (block == kPictureBlock) {
      ParseFrame(bytes, screen, frame);
      return bytes.Ok() ? Status::Ok : Status::FileReadError;
    }
    if (block != kExtensionBlock) {
      if (++garbage > limits.garbageBytes) return Status::DamagedFile;
      continue;
    }
    const uint8_t label = bytes.U8();
    if (label == kGraphicControl) {
      ParseGraphicControl(bytes, frame);
    } else if (label == kComment && remarks != nullptr) {
      const auto text = TakeSubBlocks(bytes, limits.exifTextBytes);
      remarks->comment.insert(remarks->comment.end(), text.begin(), text.end());
    } else if (label == kApplication && remarks != nullptr) {
      ParseApplication(bytes, *remarks);
    } else {
      SkipSubBlocks(bytes);
    }
  }
  return Status::FileReadError;
}

void SkipFrame(ByteReader& bytes) { SkipSubBlocks(bytes); }

void TakeColors(const GifFrame& frame, Palette& palette) {
  if (frame.palette.bits == 0) {
    palette = GrayRamp();
    return;
  }
  palette.fill(0);
  std::copy(frame.palette.colors.begin(), frame.palette.colors.end(), palette.begin());
}

int32_t InterlacedRow(int32_t r, int32_t height) {
  struct Pass {
    int32_t first, step;
  };
  constexpr Pass kPasses[] = {{0, 8}, {4, 8}, {2, 4}, {1, 2}};
  for (const Pass& pass : kPasses) {
    const int32_t rows =
        height > pass.first ? (height - pass.first + pass.step - 1) / pass.step : 0;
    if (r < rows) return pass.first + r * pass.step;
    r -= rows;
  }
  return 0;
}

Status DecodeFrame(ByteReader& bytes, const GifFrame& frame, platform::MemoryBlock& pixels,
                   uint64_t* done) {
  const uint64_t count = static_cast<uint64_t>(frame.width) * static_cast<uint64_t>(frame.height);
  if (count > limits.packedBlockBytes) return Status::MemoryAllocationError;
  bytes.Seek(frame.dataOffset);
  const bool whole = done == nullptr;
  if (whole && bytes.Left() < count / kMostPixelsPerByte) return Status::FileReadError;
  if (!pixels.Allocate(count, whole ? platform::Fill::Unset : platform::Fill::Zero))
    return Status::MemoryAllocationError;
  RETURN_IF_BAD(DecodeGifPixels(bytes, pixels.Bytes(), done));
  bytes.Seek(frame.dataOffset + 1);
  SkipFrame(bytes);
  return Status::Ok;
}

void WriteGifComment(ByteWriter& out, std::span<const uint8_t> comment) {
  if (comment.empty()) return;
  out.U8(kExtensionBlock);
  out.U8(kComment);
  for (; !comment.empty(); comment = comment.subspan(std::min<size_t>(comment.size(), 255))) {
    const size_t size = std::min<size_t>(comment.size(), 255);
    out.U8(static_cast<uint8_t>(size));
    out.Bytes(comment.first(size));
  }
  out.U8(0);
}

}  // namespace fotomill
