#include "support/exif_blocks.h"

#include "support/hex.h"

namespace fotomill::test {

std::vector<uint8_t> BigEndianBlock() {
  return Hex(R"(
    4D4D 002A 00000008             # 00 header
    0005                           # 08 first directory
    010F 0002 00000005 0000004A    #    manufacturer: "Acme"
    0112 0003 00000001 0003 0000   #    orientation 3, in the upper half of the field
    8769 0004 00000001 0000007E    #    EXIF directory
    8825 0004 00000001 000000B0    #    GPS directory
    C4A5 0007 00000004 01020304    #    a tag without a name, four bytes in file order
    00000050                       #    next directory
    41 63 6D 65 00 00              # 4A "Acme", a byte of padding
    0003                           # 50 second directory
    0103 0003 00000001 0006 0000   #    compressed as JPEG
    0201 0004 00000001 0000007A    #    offset of the thumbnail
    0202 0004 00000001 00000004    #    its size
    00000000                       #    no next directory
    FFD8 FFD9                      # 7A thumbnail
    0003                           # 7E EXIF
    829A 0005 00000001 000000A8    #    exposure time 1/60
    9000 0007 00000004 30323230    #    version "0220"
    9209 0003 00000001 0019 0000   #    flash
    00000000
    00000001 0000003C              # A8 1/60
    0002                           # B0 GPS
    0000 0001 00000004 02020000    #    version 2.2.0.0
    0001 0002 00000002 53000000    #    "S"
    00000000                       # end at CE
  )");
}

std::vector<uint8_t> LittleEndianBlock() {
  return Hex(R"(
    4949 2A00 08000000             # 00 header
    0500                           # 08 first directory
    0F01 0200 05000000 4A000000    #    manufacturer: "Acme"
    1201 0300 01000000 0300 0000   #    orientation 3, in the lower half of the field
    6987 0400 01000000 7E000000    #    EXIF directory
    2588 0400 01000000 B0000000    #    GPS directory
    A5C4 0700 04000000 01020304    #    a tag without a name, four bytes in file order
    50000000                       #    next directory
    41 63 6D 65 00 00              # 4A "Acme", a byte of padding
    0300                           # 50 second directory
    0301 0300 01000000 0600 0000   #    compressed as JPEG
    0102 0400 01000000 7A000000    #    offset of the thumbnail
    0202 0400 01000000 04000000    #    its size
    00000000                       #    no next directory
    FFD8 FFD9                      # 7A thumbnail
    0300                           # 7E EXIF
    9A82 0500 01000000 A8000000    #    exposure time 1/60
    0090 0700 04000000 30323230    #    version "0220"
    0992 0300 01000000 1900 0000   #    flash
    00000000
    01000000 3C000000              # A8 1/60
    0200                           # B0 GPS
    0000 0100 04000000 02020000    #    version 2.2.0.0
    0100 0200 02000000 53000000    #    "S"
    00000000                       # end at CE
  )");
}

BlockBuilder::BlockBuilder() { block = Hex("4949 2A00 08000000"); }

uint32_t BlockBuilder::Directory(const std::vector<Entry>& entries, uint32_t next) {
  const auto offset = static_cast<uint32_t>(block.size());
  Put16(static_cast<uint16_t>(entries.size()));
  for (const Entry& entry : entries) {
    Put16(entry.tag);
    Put16(entry.type);
    Put32(entry.count);
    Put32(entry.value);
  }
  Put32(next);
  return offset;
}

uint32_t BlockBuilder::Bytes(const std::vector<uint8_t>& bytes) {
  const auto offset = static_cast<uint32_t>(block.size());
  block.insert(block.end(), bytes.begin(), bytes.end());
  return offset;
}

void BlockBuilder::Patch32(uint32_t offset, uint32_t number) {
  for (uint32_t i = 0; i < 4; ++i) block[offset + i] = static_cast<uint8_t>(number >> (8 * i));
}

uint32_t BlockBuilder::LinkOf(uint32_t offset) const {
  const auto count = static_cast<uint32_t>(block[offset] | block[offset + 1] << 8);
  return offset + 2 + 12 * count;
}

void BlockBuilder::Put16(uint16_t number) {
  block.push_back(static_cast<uint8_t>(number));
  block.push_back(static_cast<uint8_t>(number >> 8));
}

void BlockBuilder::Put32(uint32_t number) {
  Put16(static_cast<uint16_t>(number));
  Put16(static_cast<uint16_t>(number >> 16));
}

}  // namespace fotomill::test
