#pragma once

#include <cstdint>
#include <span>

#include "core/byte_reader.h"
#include "core/byte_writer.h"
#include "core/status.h"

namespace fotomill {

// GIF's variable-length LZW: codes of up to 12 bits, least significant
// bit first, in sub-blocks of up to 255 bytes that end in an empty
// one. The first byte is the number of bits per pixel, 2 to 8.

// Decodes pixels.size() indices from `bytes`, which is at the first byte. Ok once all pixels are
// decoded, with or without an end code; the reader is then left somewhere in the data. DamagedFile
// for an invalid code or a pixel size outside 1 to 8, FileReadError if truncated. `done`, which may
// be null, receives the number of decoded pixels in any case.
Status DecodeGifPixels(ByteReader& bytes, std::span<uint8_t> pixels, uint64_t* done = nullptr);

// Encodes indices of `bits` per pixel (1 to 8), passed in pieces of any length.
class GifPixelEncoder {
 public:
  GifPixelEncoder(ByteWriter& out, int32_t bits);  // `bits` per pixel, 1 to 8
  void Add(std::span<const uint8_t> pixels);  // indices, one byte each
  // Writes pending bits, the end code and the empty block.
  void Finish();

 private:
  static constexpr uint32_t kTableSize = 16384;  // four times the codes, for short probes
  static constexpr int32_t kNone = -1;

  void PutCode(uint32_t code);
  void FlushBytes(bool all);
  void ClearTable();

  ByteWriter& out_;
  const uint32_t clearCode_;
  uint32_t codeBits_ = 0;
  uint32_t nextCode_ = 0;
  int32_t prefix_ = kNone;  // code of the current string
  uint64_t pending_ = 0;    // unwritten bits, oldest lowest
  uint32_t pendingBits_ = 0;
  uint8_t block_[255];
  size_t blockSize_ = 0;
  uint32_t keys_[kTableSize];  // (prefix << 8 | pixel) + 1, 0 free
  uint16_t codes_[kTableSize];
};

}  // namespace fotomill
