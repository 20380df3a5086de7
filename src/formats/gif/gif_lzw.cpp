#include "formats/gif/gif_lzw.h"

#include <algorithm>
#include <cstring>

namespace fotomill {

namespace {

constexpr uint32_t kMostCodes = 4096;
constexpr uint32_t kMostCodeBits = 12;

// Reads codes across sub-blocks.
class CodeReader {
 public:
  explicit CodeReader(ByteReader& bytes) : bytes_(bytes) {}

  // The next code of `count` bits; false at the end of the data.
  bool Next(uint32_t count, uint32_t& code) {
    while (held_ < count) {
      if (left_ == 0) {
        block_ = bytes_.Take(bytes_.U8());
        left_ = block_.size();
        if (left_ == 0) return false;
      }
      bits_ |= uint64_t{block_[block_.size() - left_]} << held_;
      held_ += 8;
      --left_;
    }
    code = static_cast<uint32_t>(bits_) & ((1u << count) - 1);
    bits_ >>= count;
    held_ -= count;
    return true;
  }

 private:
  ByteReader& bytes_;
  std::span<const uint8_t> block_;
  size_t left_ = 0;
  uint64_t bits_ = 0;
  uint32_t held_ = 0;
};

// The position of a code's string in the decoded pixels. A new string is the previous one plus its
// next pixel, which the output already contains.
struct DecodedString {
  uint64_t start;
  uint32_t length;
};

// Copies forward byte by byte if the ranges overlap, as needed for a string that repeats
// its own start.
void CopyString(uint8_t* to, const uint8_t* from, uint64_t length) {
  if (to - from >= static_cast<std::ptrdiff_t>(length)) {
    std::memcpy(to, from, length);
  } else {
    for (uint64_t i = 0; i < length; ++i) to[i] = from[i];
  }
}

}  // namespace

Status DecodeGifPixels(ByteReader& bytes, std::span<uint8_t> pixels, uint64_t* decoded) {
  const uint32_t pixelBits = bytes.U8();
  if (!bytes.Ok()) return Status::FileReadError;
  if (pixelBits < 1 || pixelBits >= kMostCodeBits) return Status::DamagedFile;
  const uint32_t clearCode = 1u << pixelBits, endCode = clearCode + 1;
  DecodedString strings[kMostCodes];
  CodeReader codes(bytes);
  uint32_t codeBits = pixelBits + 1, nextCode = endCode + 1, code = 0;
  DecodedString before{0, 0};  // the previous string; empty after a clear code
  uint64_t none = 0;
  uint64_t& done = decoded != nullptr ? *decoded : none;
  done = 0;
  while (done < pixels.size()) {
    if (!codes.Next(codeBits, code)) return Status::FileReadError;
    if (code == clearCode) {
      codeBits = pixelBits + 1;
      nextCode = endCode + 1;
      before.length = 0;
      continue;
    }
    if (code == endCode) return Status::FileReadError;
    if (code > nextCode || (code == nextCode && before.length == 0)) return Status::DamagedFile;
    if (before.length != 0 && nextCode < kMostCodes) {
      strings[nextCode++] = {before.start, before.length + 1};
      if (nextCode == 1u << codeBits && codeBits < kMostCodeBits) ++codeBits;
    }
    if (code < clearCode) {
      before = {done, 1};
      pixels[done++] = static_cast<uint8_t>(code);
    } else {
      const DecodedString string = strings[code];
      const uint64_t length = std::min<uint64_t>(string.length, pixels.size() - done);
      CopyString(&pixels[done], &pixels[string.start], length);
      before = {done, string.length};
      done += length;
    }
  }
  return Status::Ok;
}

GifPixelEncoder::GifPixelEncoder(ByteWriter& out, int32_t bits)
    : out_(out), clearCode_(1u << std::max(bits, 2)) {
  out_.U8(static_cast<uint8_t>(std::max(bits, 2)));
  ClearTable();
  PutCode(clearCode_);
}

void GifPixelEncoder::ClearTable() {
  std::memset(keys_, 0, sizeof keys_);
  nextCode_ = clearCode_ + 2;
  codeBits_ = 3;
  while (1u << codeBits_ <= clearCode_) ++codeBits_;
}

void GifPixelEncoder::PutCode(uint32_t code) {
  pending_ |= uint64_t{code} << pendingBits_;
  pendingBits_ += codeBits_;
  FlushBytes(false);
}

void GifPixelEncoder::FlushBytes(bool all) {
  while (pendingBits_ >= 8 || (all && pendingBits_ > 0)) {
    block_[blockSize_++] = static_cast<uint8_t>(pending_);
    pending_ >>= 8;
    pendingBits_ -= std::min(pendingBits_, 8u);
    if (blockSize_ == sizeof block_) {
      out_.U8(static_cast<uint8_t>(blockSize_));
      out_.Bytes({block_, blockSize_});
      blockSize_ = 0;
    }
  }
}

void GifPixelEncoder::Add(std::span<const uint8_t> pixels) {
  for (const uint8_t pixel : pixels) {
    if (prefix_ == kNone) {
      prefix_ = pixel;
      continue;
    }
    const uint32_t key = (static_cast<uint32_t>(prefix_) << 8 | pixel) + 1;
    uint32_t place = key * 2654435761u >> 18;  // multiplicative hash, the upper 14 bits
    while (keys_[place] != 0 && keys_[place] != key) place = (place + 1) % kTableSize;
    if (keys_[place] == key) {
      prefix_ = codes_[place];
      continue;
    }
    PutCode(static_cast<uint32_t>(prefix_));
    prefix_ = pixel;
    if (nextCode_ == kMostCodes) {
      PutCode(clearCode_);
      ClearTable();
      continue;
    }
    if (nextCode_ == 1u << codeBits_) ++codeBits_;
    keys_[place] = key;
    codes_[place] = static_cast<uint16_t>(nextCode_++);
  }
}

void GifPixelEncoder::Finish() {
  if (prefix_ != kNone) {
    PutCode(static_cast<uint32_t>(prefix_));
    if (nextCode_ == 1u << codeBits_ && codeBits_ < kMostCodeBits) ++codeBits_;
  }
  PutCode(clearCode_ + 1);
  FlushBytes(true);
  if (blockSize_ > 0) {
    out_.U8(static_cast<uint8_t>(blockSize_));
    out_.Bytes({block_, blockSize_});
  }
  out_.U8(0);
}

}  // namespace fotomill
