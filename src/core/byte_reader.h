#pragma once

#include <bit>
#include <cstdint>
#include <cstring>
#include <span>
#include <string_view>

namespace fotomill {

// Reads a byte span front to back within its bounds. A read past the end gives 0 (or an empty
// view), marks the reader as short and leaves it there: later reads give 0 as well. Ask Ok() once
// per structure, and before any number that was read decides an allocation or a loop. The reader
// does not own the bytes.
class ByteReader {
 public:
  explicit ByteReader(std::span<const uint8_t> bytes) : bytes_(bytes) {}  // does not own the bytes

  // Whether no read has run past the end so far; where the next read begins, and what is left of
  // how many bytes.
  bool Ok() const { return !short_; }
  uint64_t Position() const { return position_; }  // bytes from the start
  uint64_t Left() const { return bytes_.size() - position_; }  // bytes up to the end
  uint64_t Size() const { return bytes_.size(); }  // all bytes, read or not

  // Numbers in the byte order of their name; 0 where not all of their bytes are there.
  uint8_t U8() {
    return position_ < bytes_.size() ? bytes_[position_++] : static_cast<uint8_t>(Fail());
  }
  uint16_t Le16() { return static_cast<uint16_t>(Little(2)); }  // little-endian
  uint32_t Le32() { return static_cast<uint32_t>(Little(4)); }
  uint64_t Le64() { return Little(8); }
  uint16_t Be16() { return static_cast<uint16_t>(Big(2)); }  // big-endian
  uint32_t Be32() { return static_cast<uint32_t>(Big(4)); }
  uint64_t Be64() { return Big(8); }

  // The next `count` bytes as a view into the span; empty, and the reader short, when fewer are
  // left.
  std::span<const uint8_t> Take(uint64_t count) {
    if (count > Left()) {
      Fail();
      return {};
    }
    const auto view = bytes_.subspan(position_, count);
    position_ += count;
    return view;
  }
  // The next bytes without consuming them, as many as are left but at most `count`.
  std::span<const uint8_t> Peek(uint64_t count) const {
    return bytes_.subspan(position_, count < Left() ? count : Left());
  }
  void Skip(uint64_t count) { (void)Take(count); }  // beyond the end: fails as a read does
  // Moves to an offset from the start; beyond the end the reader is short.
  void Seek(uint64_t offset) {
    if (offset > bytes_.size()) {
      Fail();
    } else if (!short_) {
      position_ = offset;
    }
  }
  // Consumes `text` when it comes next; otherwise returns false and stays.
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
