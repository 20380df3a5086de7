#pragma once

#include <cstdint>
#include <string>
#include <vector>

#include "metadata/exif/exif_walk.h"

namespace fotomill::test {

// The same block in both byte orders: IFD0, thumbnail,
// EXIF and GPS directories, with equal values.
std::vector<uint8_t> BigEndianBlock();
std::vector<uint8_t> LittleEndianBlock();

// Collects the walk as texts: "DIRECTORY EXIF" and "NAME=TEXT".
class CollectedLines : public ExifSink {
 public:
  void Directory(int32_t number, std::string_view label) override {
    numbers.push_back(number);
    lines.push_back("DIRECTORY " + std::string(label));
  }
  void Line(const ExifLine& line) override {
    lines.push_back(std::string(line.name) + "=" + std::string(line.text));
  }
  std::vector<std::string> lines;
  std::vector<int32_t> numbers;
};

// Builds a little-endian block of consecutive directories, for cases that no camera writes.
class BlockBuilder {
 public:
  struct Entry {
    uint16_t tag, type;
    uint32_t count, value;  // `value` is the 4-byte field
  };
  BlockBuilder();
  // Appends a directory and returns its offset.
  uint32_t Directory(const std::vector<Entry>& entries, uint32_t next = 0);
  uint32_t Bytes(const std::vector<uint8_t>& bytes);
  void Patch32(uint32_t offset, uint32_t number);
  // Offset of the link in the directory at `offset`.
  uint32_t LinkOf(uint32_t offset) const;
  std::vector<uint8_t> block;

 private:
  void Put16(uint16_t number);
  void Put32(uint32_t number);
};

}  // namespace fotomill::test
