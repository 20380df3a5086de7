#pragma once

#include <cstdint>
#include <iterator>
#include <span>
#include <vector>

namespace fotomill {

// Bytes of one value of an EXIF or TIFF type, and of the numbers in it; 0: unknown type.
// Source: Adobe, "TIFF Revision 6.0" (1992), section 2; the libtiff project, "The BigTIFF Design".
constexpr uint64_t DirectoryValueBytes(uint64_t type) {
  constexpr uint8_t kBytes[] = {0, 1, 1, 2, 4, 8, 1, 1, 2, 4, 8, 4, 8, 4, 0, 0, 8, 8, 8};
  return type < std::size(kBytes) ? kBytes[type] : 0;
}
constexpr uint64_t DirectoryUnitBytes(uint64_t type) {
  const bool fraction = type == 5 || type == 10;  // two numbers
  return fraction ? 4 : DirectoryValueBytes(type);
}

// The bytes of a file made of directories: TIFF, BigTIFF, HD Photo, or a block of EXIF.
class DirectoryBytes {
 protected:
  explicit DirectoryBytes(std::span<const uint8_t> file) : file_(file) {}

  // Reads the byte order and the version. False if one of them is unknown.
  bool ReadOrder() {
    constexpr uint64_t kClassic = 42, kBig = 43, kHdPhoto = 0x01BC;
    if (file_.size() < 2 || file_[0] != file_[1] || (file_[0] != 'I' && file_[0] != 'M'))
      return false;
    bigEndian_ = file_[0] == 'M';
    const uint64_t version = Number(2, 2);
    wide_ = version == kBig;
    return version == kClassic || wide_ || (version == kHdPhoto && !bigEndian_);
  }

  // Sizes of an offset, of a directory's count and of an entry.
  uint64_t Word() const { return wide_ ? 8 : 4; }
  uint64_t CountBytes() const { return wide_ ? 8 : 2; }
  uint64_t EntryBytes() const { return wide_ ? 20 : 12; }
  // Offset of the first directory's offset.
  uint64_t FirstAt() const { return wide_ ? 8 : 4; }

  bool Holds(uint64_t at, uint64_t size) const {
    return at <= file_.size() && size <= file_.size() - at;
  }
  // An integer at an offset; 0 beyond the end of the file.
  uint64_t Number(uint64_t at, uint64_t size) const {
    uint64_t number = 0;
    if (!Holds(at, size)) return 0;
    for (uint64_t i = 0; i < size; ++i)
      number = number << 8 | file_[at + (bigEndian_ ? i : size - 1 - i)];
    return number;
  }
  // Element `i` of values of a type at an offset; 0 beyond the end of the file.
  uint64_t Element(uint64_t at, uint64_t type, uint64_t i) const {
    const uint64_t each = DirectoryValueBytes(type);
    return Number(at + i * each, each);
  }
  // An integer as the file stores it.
  void Store(uint64_t number, std::span<uint8_t> bytes) const {
    for (size_t i = 0; i < bytes.size(); ++i)
      bytes[bigEndian_ ? bytes.size() - 1 - i : i] = static_cast<uint8_t>(number >> 8 * i);
  }

  const std::span<const uint8_t> file_;
  bool bigEndian_ = false, wide_ = false;
};

}  // namespace fotomill
