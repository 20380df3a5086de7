#pragma once

#include <array>
#include <cstdint>
#include <span>

#include "core/status.h"

namespace fotomill {

// A JPEG stream without quantization tables, and the tables for it.
struct PegasusStream {
  std::span<const uint8_t> data = {};
  bool bare = false;  // the file is a stream without a bitmap header
  // from the "PIC" segment: 32 selects the tables of T.81, K.1; 0 if there is none
  uint8_t lumaCode = 0, chromaCode = 0;
  // an abbreviated stream with two quantization tables; empty without codes
  std::array<uint8_t, 2 + 2 * (5 + 64) + 2> tables = {};
  bool hasTables = false;

  std::span<const uint8_t> Tables() const {
    return hasTables ? std::span<const uint8_t>(tables) : std::span<const uint8_t>();
  }
};

// Finds the stream in a file. DamagedFile, FileReadError for a truncated header, UnsupportedFormat
// for data in a coding other than JPEG's.
Status FindPegasusStream(std::span<const uint8_t> file, PegasusStream& stream);

}  // namespace fotomill
