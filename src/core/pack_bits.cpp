#include "core/pack_bits.h"

#include <algorithm>
#include <cstring>

namespace fotomill {

namespace {

constexpr size_t kMostInToken = 128;
constexpr uint8_t kNothing = 128;

size_t RunLength(std::span<const uint8_t> row, size_t at) {
  const size_t end = std::min(row.size(), at + kMostInToken);
  size_t next = at + 1;
  while (next < end && row[next] == row[at]) ++next;
  return next - at;
}

}  // namespace

bool UnpackBits(std::span<const uint8_t>& code, std::span<uint8_t> row) {
  size_t at = 0, filled = 0;
  bool whole = true;
  while (filled < row.size()) {
    if (at >= code.size()) {
      whole = false;
      break;
    }
    const uint8_t control = code[at++];
    if (control == kNothing) continue;
    const bool repeats = control > kNothing;
    const size_t count = repeats ? 257u - control : control + 1u;
    const size_t needed = repeats ? 1 : count, room = std::min(count, row.size() - filled);
    if (code.size() - at < std::min(needed, room)) {
      whole = false;
      at = code.size();
      break;
    }
    if (repeats) {
      std::memset(&row[filled], code[at], room);
    } else {
      std::memcpy(&row[filled], &code[at], room);
    }
    at += std::min(needed, code.size() - at);
    filled += room;
  }
  code = code.subspan(at);
  return whole;
}

size_t PackBits(std::span<const uint8_t> row, uint8_t* code) {
  uint8_t* out = code;
  size_t at = 0, literals = 0;  // length of the literal run before `at`
  const auto flush = [&] {
    if (literals == 0) return;
    *out++ = static_cast<uint8_t>(literals - 1);
    std::memcpy(out, &row[at - literals], literals);
    out += literals;
    literals = 0;
  };
  while (at < row.size()) {
    const size_t run = RunLength(row, at);
    if (run >= 3 || (run == 2 && literals == 0)) {
      flush();
      *out++ = static_cast<uint8_t>(257 - run);
      *out++ = row[at];
      at += run;
      continue;
    }
    ++at;
    if (++literals == kMostInToken) flush();
  }
  flush();
  return static_cast<size_t>(out - code);
}

}  // namespace fotomill
