#include "archive/archive_kind.h"

#include <algorithm>
#include <string_view>

#include "core/byte_reader.h"

namespace fotomill {

namespace {

using namespace std::string_view_literals;

// End of central directory: 22 bytes and a comment of up to 65,535.
constexpr uint64_t kEndSize = 22, kLongestComment = 65535;
constexpr std::string_view kEnd = "PK\5\6"sv;
constexpr uint16_t kSeeZip64 = 0xFFFF;

// RAR 4: type of the archive header, and its flags.
constexpr uint8_t kMainHeader4 = 0x73;
constexpr uint16_t kVolume4 = 0x0001, kLocked4 = 0x0080;
// RAR 5.
constexpr uint64_t kMainHeader5 = 1, kEncryptionHeader5 = 4;
constexpr uint64_t kExtraArea5 = 0x0001, kDataArea5 = 0x0002, kVolume5 = 0x0001;

// A RAR 5 number: 7 bits per byte, lowest first; the top bit means that more follow.
uint64_t Number5(ByteReader& bytes) {
  uint64_t value = 0;
  for (unsigned shift = 0; shift < 63; shift += 7) {
    const uint8_t byte = bytes.U8();
    value |= uint64_t{byte & 0x7Fu} << shift;
    if ((byte & 0x80) == 0) break;
  }
  return value;
}

ArchiveKind Rar4Kind(ByteReader bytes) {
  bytes.Skip(2);  // CRC
  const uint8_t type = bytes.U8();
  const uint16_t flags = type == kMainHeader4 ? bytes.Le16() : uint16_t{0};
  return {ArchiveKind::Rar4, (flags & kVolume4) != 0, (flags & kLocked4) != 0};
}

ArchiveKind Rar5Kind(ByteReader bytes) {
  bytes.Skip(4);         // CRC
  (void)Number5(bytes);  // size of the header
  const uint64_t type = Number5(bytes), flags = Number5(bytes);
  if (type == kEncryptionHeader5) return {ArchiveKind::Rar5, false, true};
  if ((flags & kExtraArea5) != 0) (void)Number5(bytes);
  if ((flags & kDataArea5) != 0) (void)Number5(bytes);
  const uint64_t archive = type == kMainHeader5 ? Number5(bytes) : 0;
  return {ArchiveKind::Rar5, (archive & kVolume5) != 0, false};
}

ArchiveKind ZipKind(std::span<const uint8_t> file) {
  const uint64_t tail = std::min<uint64_t>(file.size(), kEndSize + kLongestComment);
  const auto bytes = file.last(tail);
  const auto found = std::find_end(bytes.begin(), bytes.end(), kEnd.begin(), kEnd.end(),
                                   [](uint8_t a, char b) { return a == static_cast<uint8_t>(b); });
  if (found == bytes.end()) {
    const bool firstPart = ByteReader(file).Match("PK\7\x08"sv);
    const bool starts = ByteReader(file).Match("PK\3\4"sv);
    return {firstPart || starts ? ArchiveKind::Zip : ArchiveKind::None, firstPart, false};
  }
  ByteReader end(bytes.subspan(static_cast<size_t>(found - bytes.begin()) + kEnd.size()));
  const uint16_t disk = end.Le16(), directoryDisk = end.Le16();
  const auto later = [](uint16_t number) { return number != 0 && number != kSeeZip64; };
  return {ArchiveKind::Zip, later(disk) || later(directoryDisk), false};
}

}  // namespace

ArchiveKind ArchiveKindOf(std::span<const uint8_t> file) {
  ByteReader bytes(file);
  if (bytes.Match("Rar!\x1A\7\0"sv)) return Rar4Kind(bytes);
  if (bytes.Match("Rar!\x1A\7\1\0"sv)) return Rar5Kind(bytes);
  return ZipKind(file);
}

}  // namespace fotomill
