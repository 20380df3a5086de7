#pragma once

#include <cstdint>
#include <string>
#include <vector>

#include "metadata/exif/exif_walk.h"

namespace fotomill::test {

// One picture's block in both byte orders: first directory, thumbnail, EXIF and GPS directories,
// the same values in each.
std::vector<uint8_t> BigEndianBlock();
std::vector<uint8_t> LittleEndianBlock();

// Collects a walk as texts: "DIRECTORY EXIF" and "NAME=TEXT".
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

// A little-endian block of directories laid out one behind the other, for what no camera writes.
class BlockBuilder {
 public:
  struct Entry {
    uint16_t tag, type;
    uint32_t count, value;  // the value is the 4-byte field
  };
  BlockBuilder();
  // Adds a directory at the end and returns its offset.
  uint32_t Directory(const std::vector<Entry>& entries, uint32_t next = 0);
  uint32_t Bytes(const std::vector<uint8_t>& bytes);
  void Patch32(uint32_t offset, uint32_t number);
  // Where the link of the directory at `offset` is.
  uint32_t LinkOf(uint32_t offset) const;
  std::vector<uint8_t> block;

 private:
  void Put16(uint16_t number);
  void Put32(uint32_t number);
};

}  // namespace fotomill::test
