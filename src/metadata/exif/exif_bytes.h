#pragma once

#include <bit>
#include <cstdint>
#include <cstring>
#include <span>

#include "metadata/exif/exif_tags.h"

namespace fotomill {

// Reads numbers from an EXIF block in its byte order. Bytes beyond the end read as 0, so a bad
// offset yields truncated data, not an error. Does not own the bytes.
class ExifBytes {
 public:
  ExifBytes() = default;
  ExifBytes(std::span<const uint8_t> bytes, bool bigEndian)
      : bytes_(bytes), bigEndian_(bigEndian) {}

  // Offsets are from the start of the block.
  uint64_t Size() const { return bytes_.size(); }
  bool BigEndian() const { return bigEndian_; }  // "MM"
  uint8_t U8(uint64_t offset) const { return offset < bytes_.size() ? bytes_[offset] : uint8_t{0}; }
  uint16_t U16(uint64_t offset) const { return Number<uint16_t>(offset); }
  uint32_t U32(uint64_t offset) const { return Number<uint32_t>(offset); }
  // Up to `count` bytes from `offset`.
  std::span<const uint8_t> Part(uint64_t offset, uint64_t count) const {
    if (offset >= bytes_.size()) return {};
    const uint64_t left = bytes_.size() - offset;
    return bytes_.subspan(offset, count < left ? count : left);
  }

 private:
  template <typename T>
  T Number(uint64_t offset) const {
    T number = 0;
    if (offset + sizeof number <= bytes_.size()) {
      std::memcpy(&number, bytes_.data() + offset, sizeof number);
    } else if (offset < bytes_.size()) {
      std::memcpy(&number, bytes_.data() + offset, bytes_.size() - offset);
    }
    if (bigEndian_ == (std::endian::native == std::endian::big)) return number;
    if constexpr (sizeof number == 2) return __builtin_bswap16(number);
    return static_cast<T>(__builtin_bswap32(number));
  }

  std::span<const uint8_t> bytes_;
  bool bigEndian_ = false;
};

// TIFF types not in EXIF. Sources: TIFF 6.0, section 2; Adobe PageMaker 6.0 TIFF Technical Notes
// (1995).
inline constexpr uint16_t kTiffFloat = 11;
inline constexpr uint16_t kTiffDouble = 12;  // 8 bytes
inline constexpr uint16_t kTiffIfd = 13;  // 4 bytes: the offset of a directory

// A directory has a 2-byte count, the entries, and the 4-byte offset of the next directory.
//
//   offset size  field of an entry
//        0    2  tag
//        2    2  type
//        4    4  number of values
//        8    4  the values; if they need more than 4 bytes, their offset in the block
inline constexpr uint64_t kExifCountSize = 2;
inline constexpr uint64_t kExifEntrySize = 12;
inline constexpr uint64_t kExifLinkSize = 4;

// Size of one value in the block, by TIFF 6.0: 2 for SSHORT; 1 for unknown types. FLOAT, DOUBLE and
// IFD are never displayed, but editing needs their size.
constexpr uint32_t ExifStoredSize(uint16_t type) {
  switch (type) {
    case kExifShort:
    case kExifSShort: return 2;
    case kExifLong:
    case kExifSLong:
    case kTiffFloat:
    case kTiffIfd: return 4;
    case kExifRational:
    case kExifSRational:
    case kTiffDouble: return 8;
    default: return 1;
  }
}

// A directory entry and the offset of its values.
struct ExifField {
  uint16_t tag = 0;
  uint16_t type = 0;
  uint32_t count = 0;
  uint64_t entryOffset = 0;  // of the entry
  uint64_t valueOffset = 0;  // of its first value; may be beyond the block
  // In bytes. Not limited by the size of the block.
  uint64_t ValueSize() const { return uint64_t{count} * ExifStoredSize(type); }
};

// Reads the entry at `offset`.
inline ExifField ReadExifField(const ExifBytes& block, uint64_t offset) {
  ExifField field;
  field.tag = block.U16(offset);
  field.type = block.U16(offset + 2);
  field.count = block.U32(offset + 4);
  field.entryOffset = offset;
  field.valueOffset = field.ValueSize() <= 4 ? offset + 8 : block.U32(offset + 8);
  return field;
}

// Header: byte order, magic number, offset of the first directory. Source: TIFF 6.0, section 2.
inline constexpr uint16_t kExifMagic = 42;
inline constexpr uint64_t kExifHeaderSize = 8;
// Tags whose values are offsets or sizes. Source: CIPA DC-008-2012, section 4.6.
inline constexpr uint16_t kExifPointerTag = 0x8769;
inline constexpr uint16_t kGpsPointerTag = 0x8825;  // offset of the GPS directory
inline constexpr uint16_t kThumbnailOffsetTag = 0x0201;  // JPEGInterchangeFormat
inline constexpr uint16_t kThumbnailSizeTag = 0x0202;  // JPEGInterchangeFormatLength

// "II" means little-endian, anything else big-endian.
inline ExifBytes OpenExifBytes(std::span<const uint8_t> block) {
  const bool little = block.size() >= 2 && block[0] == 'I' && block[1] == 'I';
  return {block, !little};
}

}  // namespace fotomill
