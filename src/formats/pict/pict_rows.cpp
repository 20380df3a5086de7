#include "formats/pict/pict_rows.h"

#include <algorithm>

#include "core/byte_reader.h"
#include "core/pack_bits.h"
#include "processing/pixel_rows.h"

namespace fotomill {

namespace {

// PackBits with 2-byte units.
bool UnpackPixels(std::span<const uint8_t> code, std::span<uint8_t> row) {
  ByteReader bytes(code);
  size_t at = 0;
  while (at + 1 < row.size()) {
    const uint8_t control = bytes.U8();
    if (!bytes.Ok()) return false;
    if (control == 128) continue;
    const bool repeats = control > 128;
    const size_t count = repeats ? 257u - control : control + 1u;
    const size_t room = std::min(count, (row.size() - at) / 2);
    const auto pixels = bytes.Take(repeats ? 2 : 2 * count);
    if (!bytes.Ok()) return false;
    for (size_t i = 0; i < room; ++i)
      std::copy_n(&pixels[repeats ? 0 : 2 * i], 2, &row[at + 2 * i]);
    at += 2 * room;
  }
  return true;
}

uint8_t FiveToEight(uint32_t value) {
  return static_cast<uint8_t>((value & 31) << 3 | (value & 31) >> 2);
}

}  // namespace

PictRowDecoder::PictRowDecoder(const PictPixels& pixels) : pixels_(pixels), data_(pixels.data) {
  const auto width = static_cast<size_t>(pixels.bounds.width);
  const bool byColors = pixels.bits == 32 && pixels.packType == 4;
  const bool threeBytes = pixels.bits == 32 && pixels.packType == 2;
  raw_.resize(byColors     ? width * static_cast<size_t>(pixels.parts)
              : threeBytes ? pixels.rowBytes / 4 * 3
                           : pixels.rowBytes);
  bgr_.resize(3 * width);
  if (pixels.Indexed()) SetPalette();
}

void PictRowDecoder::SetPalette() {
  if (pixels_.inverted) {
    std::fill_n(palette_.begin(), 3, uint8_t{255});
    return;
  }
  ByteReader bytes(pixels_.colorTable);
  for (size_t i = 0; bytes.Left() >= 8 && i < 256; ++i) {
    const size_t stated = bytes.Be16(), index = pixels_.tableInOrder ? i : stated;
    for (size_t c = 0; c < 3; ++c) {
      const auto value = static_cast<uint8_t>(bytes.Be16() >> 8);
      if (index < 256) palette_[3 * index + c] = value;
    }
  }
}

Status PictRowDecoder::NextPacked() {
  ByteReader bytes(data_);
  const uint16_t size = pixels_.longCounts ? bytes.Be16() : bytes.U8();
  std::span<const uint8_t> code = bytes.Take(size);
  if (!bytes.Ok()) return Status::FileReadError;
  data_ = data_.subspan(bytes.Position());
  const bool whole = pixels_.bits == 16 ? UnpackPixels(code, raw_) : UnpackBits(code, raw_);
  return whole ? Status::Ok : Status::DamagedFile;
}

Status PictRowDecoder::Next() {
  if (pixels_.packed) return NextPacked();
  if (data_.size() < raw_.size()) return Status::FileReadError;
  std::copy_n(data_.begin(), raw_.size(), raw_.begin());
  data_ = data_.subspan(raw_.size());
  return Status::Ok;
}

std::span<const uint8_t> PictRowDecoder::Colors() {
  const auto width = static_cast<size_t>(pixels_.bounds.width);
  if (pixels_.Indexed()) {
    const auto bits = static_cast<size_t>(pixels_.bits), perByte = 8 / bits;
    for (size_t x = 0; x < width; ++x) {
      const size_t index =
          raw_[x / perByte] >> (8 - bits * (x % perByte + 1)) & ((size_t{1} << bits) - 1);
      for (size_t c = 0; c < 3; ++c) bgr_[3 * x + c] = palette_[3 * index + 2 - c];
    }
  } else if (pixels_.bits == 16) {
    for (size_t x = 0; x < width; ++x) {
      const auto value = static_cast<uint32_t>(raw_[2 * x] << 8 | raw_[2 * x + 1]);
      for (size_t c = 0; c < 3; ++c) bgr_[3 * x + c] = FiveToEight(value >> 5 * c);
    }
  } else if (pixels_.packType == 4) {
    const uint8_t* const red = raw_.data() + (pixels_.parts == 4 ? width : 0);
    MergeColors(red + 2 * width, red + width, red, width, bgr_.data());
  } else {
    const size_t size = pixels_.packType == 2 ? 3 : 4;
    for (size_t x = 0; x < width; ++x) {
      for (size_t c = 0; c < 3; ++c) bgr_[3 * x + c] = raw_[size * x + size - 1 - c];
    }
  }
  return bgr_;
}

}  // namespace fotomill
