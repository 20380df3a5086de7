#include "formats/tiff/tiff_lzw.h"

#include <bit>
#include <cstring>

namespace fotomill {

namespace {

constexpr uint32_t kClear = 256, kEnd = 257, kFirst = 258;
constexpr uint32_t kMostBits = 12;
constexpr uint32_t kLastCode = 4093;  // the table is cleared after it

uint64_t LoadBe64(const uint8_t* bytes) {
  uint64_t value;
  std::memcpy(&value, bytes, sizeof value);
  return std::endian::native == std::endian::little ? __builtin_bswap64(value) : value;
}

// Reads codes, most significant bit first; past the end they are 0, and Ok() turns false.
class CodeReader {
 public:
  explicit CodeReader(std::span<const uint8_t> source)
      : next_(source.data()), end_(source.data() + source.size()) {}
  uint32_t Take(unsigned width) {
    // unconditionally: cheaper than a branch that is often mispredicted
    if (end_ - next_ >= 8) {
      bits_ |= LoadBe64(next_) >> count_;
      next_ += (63 - count_) / 8;
      count_ |= 56;
    } else {
      Refill(width);
    }
    const auto code = static_cast<uint32_t>(bits_ >> (64 - width));
    bits_ <<= width;
    count_ -= width;
    return code;
  }
  bool Ok() const { return !overrun_; }

 private:
  // Near the end, byte by byte. Bits after the first `count_` are lookahead, or zeros.
  void Refill(unsigned width) {
    bits_ &= count_ == 0 ? 0 : ~uint64_t{0} << (64 - count_);
    while (count_ < width) {
      overrun_ = overrun_ || next_ == end_;
      const uint64_t byte = next_ < end_ ? *next_++ : 0;
      bits_ |= byte << (56 - count_);
      count_ += 8;
    }
  }

  const uint8_t* next_;
  const uint8_t* end_;
  uint64_t bits_ = 0;
  unsigned count_ = 0;
  bool overrun_ = false;
};

// Appends codes, with space for the maximum reserved beforehand.
class CodeWriter {
 public:
  explicit CodeWriter(uint8_t* target) : start_(target), next_(target) {}
  void Put(uint32_t code, unsigned width) {
    bits_ = bits_ << width | code;
    count_ += width;
    while (count_ >= 8) {
      count_ -= 8;
      *next_++ = static_cast<uint8_t>(bits_ >> count_);
    }
  }
  size_t Finish() {
    if (count_ > 0) *next_++ = static_cast<uint8_t>(bits_ << (8 - count_));
    count_ = 0;
    return static_cast<size_t>(next_ - start_);
  }

 private:
  uint8_t* start_;
  uint8_t* next_;
  uint64_t bits_ = 0;
  unsigned count_ = 0;
};

// Copies in blocks of 16, possibly past the end of the string, unless source and target overlap
// within a block.
void CopyString(const uint8_t* from, uint64_t length, uint64_t distance, uint8_t* to) {
  constexpr uint64_t kPiece = 16;
  if (distance < kPiece) {
    for (uint64_t i = 0; i < length; ++i) to[i] = from[i];
    return;
  }
  uint64_t done = 0;
  do {
    std::memcpy(to + done, from + done, kPiece);
    done += kPiece;
  } while (done < length);
}

}  // namespace

uint8_t* TiffLzwDecoder::Decode(std::span<const uint8_t> source, size_t size) {
  if (size > UINT32_MAX - kLiterals) return nullptr;
  // signature of the old variant
  if (source.size() >= 2 && source[0] == 0 && (source[1] & 1) != 0) return nullptr;
  output_.resize(kLiterals + size + kSlack);
  uint8_t* const bytes = output_.data();
  for (uint32_t i = 0; i < kLiterals; ++i) {
    bytes[i] = static_cast<uint8_t>(i);
    entries_[i] = {i, 1};
  }
  CodeReader codes(source);
  uint32_t next = kFirst, width = 9;
  Entry last = {0, 0};                  // the previous string; empty after a clear code
  uint32_t widest = (1u << width) - 1;  // the code at which the width grows
  uint64_t place = kLiterals;
  const uint64_t end = kLiterals + size;
  while (place < end) {
    const uint32_t code = codes.Take(width);
    if (code == kClear) {
      next = kFirst;
      width = 9;
      widest = (1u << width) - 1;
      last.length = 0;
      if (!codes.Ok()) return nullptr;
      continue;
    }
    if (code == kEnd || code > next || (code == next && last.length == 0) || !codes.Ok())
      return nullptr;
    if (last.length > 0) {
      if (next >= kMostCodes) return nullptr;
      entries_[next++] = {last.place, last.length + 1};  // its last byte is the one appended next
      if (next >= widest && width < kMostBits) widest = (1u << ++width) - 1;
    } else if (code >= kLiterals) {
      return nullptr;
    }
    const Entry entry = entries_[code];
    const uint64_t length = entry.length < end - place ? entry.length : end - place;
    CopyString(bytes + entry.place, length, place - entry.place, bytes + place);
    last = {static_cast<uint32_t>(place), entry.length};
    place += length;
  }
  return bytes + kLiterals;
}

void TiffLzwEncoder::Encode(std::span<const uint8_t> source, std::vector<uint8_t>& coded) {
  // At most one 12-bit code per byte, a clear code per table, and the final ones.
  coded.resize(source.size() * 3 / 2 + source.size() / 1024 + 64);
  CodeWriter out(coded.data());
  uint32_t next = kFirst, width = 9;
  slots_.fill(0);
  out.Put(kClear, width);
  if (source.empty()) {
    out.Put(kEnd, width);
    coded.resize(out.Finish());
    return;
  }
  uint32_t prefix = source[0];
  for (size_t i = 1; i < source.size(); ++i) {
    const uint32_t key = prefix << 8 | source[i];
    uint32_t slot = (key * 0x9E3779B1u) >> 19;
    while (slots_[slot] != 0 && slots_[slot] >> kMostBits != key) slot = (slot + 1) % kSlots;
    if (slots_[slot] != 0) {
      prefix = slots_[slot] & ((1u << kMostBits) - 1);
      continue;
    }
    out.Put(prefix, width);
    slots_[slot] = key << kMostBits | next++;
    prefix = source[i];
    if (next > kLastCode) {
      out.Put(kClear, width);
      slots_.fill(0);
      next = kFirst;
      width = 9;
    } else if (next == 1u << width) {
      ++width;
    }
  }
  out.Put(prefix, width);
  ++next;
  if (next == 1u << width && width < kMostBits) ++width;
  out.Put(kEnd, width);
  coded.resize(out.Finish());
}

}  // namespace fotomill
