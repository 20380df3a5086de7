#include "core/md5.h"

#include <array>
#include <bit>
#include <cmath>
#include <vector>

namespace fotomill {

namespace {

constexpr size_t kBlock = 64, kLengthSize = 8;
constexpr int kTurns[4][4] = {{7, 12, 17, 22}, {5, 9, 14, 20}, {4, 11, 16, 23}, {6, 10, 15, 21}};
constexpr unsigned kFirstWord[4] = {0, 1, 5, 0}, kWordStep[4] = {1, 5, 3, 7};

using State = std::array<uint32_t, 4>;

// Step i adds the integer part of 2^32 x |sin(i + 1)|.
const std::array<uint32_t, 64>& Sines() {
  static const std::array<uint32_t, 64> sines = [] {
    std::array<uint32_t, 64> made{};
    for (size_t i = 0; i < made.size(); ++i) {
      made[i] = static_cast<uint32_t>(
          std::floor(std::abs(std::sin(static_cast<double>(i + 1))) * 4294967296.0));
    }
    return made;
  }();
  return sines;
}

uint32_t Mix(unsigned round, uint32_t b, uint32_t c, uint32_t d) {
  switch (round) {
    case 0: return (b & c) | (~b & d);
    case 1: return (b & d) | (c & ~d);
    case 2: return b ^ c ^ d;
    default: return c ^ (b | ~d);
  }
}

void TakeBlock(const uint8_t* block, State& state) {
  auto [a, b, c, d] = state;
  for (unsigned i = 0; i < 64; ++i) {
    const unsigned round = i / 16;
    const uint8_t* const at = block + 4 * ((kFirstWord[round] + i % 16 * kWordStep[round]) % 16);
    const uint32_t word = at[0] | at[1] << 8 | at[2] << 16 | uint32_t{at[3]} << 24;
    const uint32_t turned =
        b + std::rotl(a + Mix(round, b, c, d) + word + Sines()[i], kTurns[round][i % 4]);
    a = d;
    d = c;
    c = b;
    b = turned;
  }
  state = {state[0] + a, state[1] + b, state[2] + c, state[3] + d};
}

}  // namespace

std::string Md5Text(std::span<const uint8_t> bytes) {
  std::vector<uint8_t> text(bytes.begin(), bytes.end());
  text.push_back(0x80);
  while (text.size() % kBlock != kBlock - kLengthSize) text.push_back(0);
  for (size_t i = 0; i < kLengthSize; ++i)
    text.push_back(static_cast<uint8_t>(uint64_t{bytes.size()} * 8 >> (8 * i)));
  State state{0x67452301, 0xefcdab89, 0x98badcfe, 0x10325476};
  for (size_t i = 0; i < text.size(); i += kBlock) TakeBlock(&text[i], state);
  std::string digits;
  for (size_t i = 0; i < 16; ++i) {
    const uint32_t byte = state[i / 4] >> (8 * (i % 4)) & 0xff;
    digits += "0123456789abcdef"[byte >> 4];
    digits += "0123456789abcdef"[byte & 15];
  }
  return digits;
}

}  // namespace fotomill
