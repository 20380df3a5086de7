#pragma once

#include <bit>
#include <cstdint>
#include <cstring>
#include <span>
#include <string_view>

namespace fotomill {

// Reads a byte span front to back, bounds-checked. A read past the end returns 0 (or an empty
// view) and marks the reader as short; all later reads then return 0 as well. Check Ok() once
// per structure, and before any value read drives an allocation or a loop. The reader does not
// own the bytes.
class ByteReader {
 public:
  explicit ByteReader(std::span<const uint8_t> bytes) : bytes_(bytes) {}  // does not own the bytes

  // Whether no read has run past the end so far; the offset of the next read, the bytes left and
  // the total.
  bool Ok() const { return !short_; }
  uint64_t Position() const { return position_; }  // bytes from the start
  uint64_t Left() const { return bytes_.size() - position_; }  // bytes left
  uint64_t Size() const { return bytes_.size(); }  // total bytes

  // Integers in the named byte order; 0 if the span ends within one.
  uint8_t U8() {
    return position_ < bytes_.size() ? bytes_[position_++] : static_cast<uint8_t>(Fail());
  }
  uint16_t Le16() { return static_cast<uint16_t>(Little(2)); }  // little-endian
  uint32_t Le32() { return static_cast<uint32_t>(Little(4)); }
  uint64_t Le64() { return Little(8); }
  uint16_t Be16() { return static_cast<uint16_t>(Big(2)); }  // big-endian
  uint32_t Be32() { return static_cast<uint32_t>(Big(4)); }
  uint64_t Be64() { return Big(8); }

  // The next `count` bytes as a view into the span; empty, with the reader marked short, if fewer
  // are left.
  std::span<const uint8_t> Take(uint64_t count) {
    if (count > Left()) {
      Fail();
      return {};
    }
    const auto view = bytes_.subspan(position_, count);
    position_ += count;
    return view;
  }
  // The next bytes without consuming them: `count`, or fewer at the end.
  std::span<const uint8_t> Peek(uint64_t count) const {
    return bytes_.subspan(position_, count < Left() ? count : Left());
  }
  void Skip(uint64_t count) { (void)Take(count); }  // past the end: the reader is short
  // Moves to an offset from the start; past the end, the reader is short.
  void Seek(uint64_t offset) {
    if (offset > bytes_.size()) {
      Fail();
    } else if (!short_) {
      position_ = offset;
    }
  }
  // Consumes `text` if it comes next; otherwise returns false without moving.
  bool Match(std::string_view text) {
    if (text.size() > Left() ||
        std::memcmp(bytes_.data() + position_, text.data(), text.size()) != 0)
      return false;
    position_ += text.size();
    return true;
  }

 private:
  uint64_t Fail() {
    short_ = true;
    position_ = bytes_.size();
    return 0;
  }
  uint64_t Little(unsigned count) {
    if (count > Left()) return Fail();
    uint64_t value = 0;
    for (unsigned i = 0; i < count; ++i) value |= uint64_t{bytes_[position_ + i]} << (8 * i);
    position_ += count;
    return value;
  }
  uint64_t Big(unsigned count) {
    if (count > Left()) return Fail();
    uint64_t value = 0;
    for (unsigned i = 0; i < count; ++i) value = value << 8 | bytes_[position_ + i];
    position_ += count;
    return value;
  }

  std::span<const uint8_t> bytes_;
  uint64_t position_ = 0;
  bool short_ = false;
};

}  // namespace fotomill
