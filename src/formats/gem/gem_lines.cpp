#include "formats/gem/gem_lines.h"

#include <algorithm>
#include <cstring>

namespace fotomill {

namespace {

constexpr uint8_t kPlain = 0x80, kOnes = 0x80, kRepeatMark = 0xff;
constexpr size_t kMostPlain = 255, kMostPatterns = 255, kMostSolid = 127;
constexpr size_t kShortestSolid = 3;     // bytes: a run costs one, and two more between literals
constexpr size_t kShortestPatterns = 5;  // bytes in addition to the pattern itself

void PutPlain(std::span<const uint8_t> bytes, std::vector<uint8_t>& code) {
  while (!bytes.empty()) {
    const auto part = bytes.first(std::min(bytes.size(), kMostPlain));
    code.push_back(kPlain);
    code.push_back(static_cast<uint8_t>(part.size()));
    code.insert(code.end(), part.begin(), part.end());
    bytes = bytes.subspan(part.size());
  }
}

// Number of bytes from `x` on that equal those `unit` before them.
size_t RepeatedBytes(std::span<const uint8_t> line, size_t x, size_t unit) {
  size_t next = x + unit;
  while (next < line.size() && line[next] == line[next - unit]) ++next;
  return next - x - unit;
}

}  // namespace

std::span<const uint8_t> GemLines::Next() {
  if (repeats_ > 0) {
    --repeats_;
    return std::span(above_);
  }
  if (!line_.empty()) line_.erase(line_.begin(), line_.begin() + static_cast<ptrdiff_t>(lineSize_));
  if (line_.empty()) {
    const auto mark = bytes_.Peek(4);
    if (mark.size() == 4 && mark[0] == 0 && mark[1] == 0 && mark[2] == kRepeatMark) {
      repeats_ = std::max(0, mark[3] - 1);
      bytes_.Skip(4);
    }
  }
  if (!Fill()) return {};
  above_.assign(line_.begin(), line_.begin() + static_cast<ptrdiff_t>(lineSize_));
  return std::span(above_);
}

bool GemLines::Fill() {
  while (line_.size() < lineSize_) {
    if (!TakeToken()) return false;
  }
  return true;
}

bool GemLines::TakeToken() {
  const uint8_t token = bytes_.U8();
  if (token == kPlain) {
    const uint8_t count = bytes_.U8();
    const auto plain = bytes_.Take(count == 0 ? kMostPlain + 1 : count);
    line_.insert(line_.end(), plain.begin(), plain.end());
  } else if (token != 0) {
    line_.insert(line_.end(), token & ~kOnes, (token & kOnes) != 0 ? 0xff : 0);
  } else if (const uint8_t count = bytes_.U8(); count > 0) {
    const auto pattern = bytes_.Take(patternSize_);
    for (int i = 0; i < count; ++i) line_.insert(line_.end(), pattern.begin(), pattern.end());
  } else {
    const size_t copied = size_t{bytes_.U8()} + 1, at = line_.size();
    if (!bytes_.Ok() || at + copied > above_.size()) return false;
    line_.insert(line_.end(), above_.begin() + static_cast<ptrdiff_t>(at),
                 above_.begin() + static_cast<ptrdiff_t>(at + copied));
  }
  return bytes_.Ok();
}

void EncodeGemLine(std::span<const uint8_t> line, size_t unit, std::vector<uint8_t>& code) {
  size_t plain = 0;  // start of the pending literal bytes
  for (size_t x = 0; x < line.size();) {
    const bool solid = line[x] == 0 || line[x] == 0xff;
    const size_t equal = solid ? RepeatedBytes(line, x, 1) + 1 : 0;
    const size_t again = RepeatedBytes(line, x, unit) / unit * unit;
    if (equal >= kShortestSolid) {
      PutPlain(line.subspan(plain, x - plain), code);
      for (size_t left = equal; left > 0;) {
        const size_t count = std::min(left, kMostSolid);
        code.push_back(static_cast<uint8_t>((line[x] & kOnes) | count));
        left -= count;
      }
      plain = x += equal;
    } else if (again >= kShortestPatterns) {
      PutPlain(line.subspan(plain, x - plain), code);
      for (size_t left = again / unit + 1; left > 0;) {
        const size_t count = std::min(left, kMostPatterns);
        code.insert(code.end(), {0, static_cast<uint8_t>(count)});
        code.insert(code.end(), line.begin() + static_cast<ptrdiff_t>(x),
                    line.begin() + static_cast<ptrdiff_t>(x + unit));
        left -= count;
      }
      plain = x += again + unit;
    } else {
      ++x;
    }
  }
  PutPlain(line.subspan(plain), code);
}

}  // namespace fotomill
