#include "formats/sgi/sgi_runs.h"

#include <algorithm>
#include <cstring>

namespace fotomill {

namespace {

constexpr uint8_t kLiteral = 0x80, kCount = 0x7f;
constexpr size_t kMostInToken = 126;  // like other writers; the format allows 127
constexpr size_t kShortestRun = 3;    // shorter runs save nothing

// Start of the next run of kShortestRun equal samples; the end if there is none.
const uint8_t* NextRun(const uint8_t* at, const uint8_t* end) {
  for (; end - at >= static_cast<ptrdiff_t>(kShortestRun); ++at) {
    if (at[0] == at[1] && at[1] == at[2]) return at;
  }
  return end;
}

uint8_t* PutLiteral(const uint8_t* from, const uint8_t* to, uint8_t* out) {
  while (from < to) {
    const size_t count = std::min<size_t>(static_cast<size_t>(to - from), kMostInToken);
    *out++ = static_cast<uint8_t>(kLiteral | count);
    std::memcpy(out, from, count);
    out += count;
    from += count;
  }
  return out;
}

uint8_t* PutRun(uint8_t value, size_t length, uint8_t* out) {
  for (; length > 0; length -= std::min(length, kMostInToken)) {
    *out++ = static_cast<uint8_t>(std::min(length, kMostInToken));
    *out++ = value;
  }
  return out;
}

}  // namespace

uint8_t RoundSgiSample(const uint8_t* sample) {
  const uint32_t value = static_cast<uint32_t>(sample[0] << 8 | sample[1]);
  return static_cast<uint8_t>((value * 255 + 32767) / 65535);
}

bool DecodeSgiRow(std::span<const uint8_t> code, std::span<uint8_t> row) {
  size_t at = 0, x = 0;
  while (x < row.size()) {
    if (at >= code.size()) return false;
    const uint8_t token = code[at++];
    const size_t count = token & kCount, room = std::min(count, row.size() - x);
    if (count == 0) return true;
    if ((token & kLiteral) != 0) {
      if (code.size() - at < room) return false;
      std::memcpy(&row[x], &code[at], room);
      at += room;
    } else {
      if (at >= code.size()) return false;
      std::memset(&row[x], code[at++], room);
    }
    x += room;
  }
  return true;
}

bool DecodeWideSgiRow(std::span<const uint8_t> code, std::span<uint8_t> row) {
  size_t at = 0, x = 0;
  while (x < row.size()) {
    if (code.size() - at < 2) return false;
    const uint8_t token = code[at + 1];
    at += 2;
    const size_t count = token & kCount, room = std::min(count, row.size() - x);
    if (count == 0) return true;
    const bool literal = (token & kLiteral) != 0;
    if (code.size() - at < (literal ? 2 * room : 2)) return false;
    for (size_t i = 0; i < room; ++i)
      row[x + i] = RoundSgiSample(&code[at + (literal ? 2 * i : 0)]);
    at += literal ? 2 * room : 2;
    x += room;
  }
  return true;
}

size_t EncodeSgiRow(std::span<const uint8_t> row, uint8_t* code) {
  uint8_t* out = code;
  const uint8_t *at = row.data(), *const end = at + row.size();
  while (at < end) {
    const uint8_t* const run = NextRun(at, end);
    out = PutLiteral(at, run, out);
    if (run == end) break;
    const uint8_t* after = run + kShortestRun;
    while (after < end && *after == *run) ++after;
    out = PutRun(*run, static_cast<size_t>(after - run), out);
    at = after;
  }
  *out++ = 0;
  return static_cast<size_t>(out - code);
}

}  // namespace fotomill
