#pragma once

#include <array>
#include <cstdint>
#include <span>

#include "core/status.h"

namespace fotomill {

// A JPEG stream without quantizer tables, and the tables that belong to it.
struct PegasusStream {
  std::span<const uint8_t> data = {};
  bool bare = false;  // the file is the stream, without a bitmap's head
  // the codes of the "PIC" segment: 32 means the tables of T.81, K.1. 0 if there is none.
  uint8_t lumaCode = 0, chromaCode = 0;
  // an abbreviated stream with two quantizer tables; empty without codes
  std::array<uint8_t, 2 + 2 * (5 + 64) + 2> tables = {};
  bool hasTables = false;

  std::span<const uint8_t> Tables() const {
    return hasTables ? std::span<const uint8_t>(tables) : std::span<const uint8_t>();
  }
};

// Finds the stream in a file. DamagedFile, FileReadError for a file that ends within its heads,
// UnsupportedFormat for data that are not of JPEG's own coders.
Status FindPegasusStream(std::span<const uint8_t> file, PegasusStream& stream);

}  // namespace fotomill
