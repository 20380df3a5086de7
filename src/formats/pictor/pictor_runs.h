#pragma once

#include <cstddef>
#include <cstdint>
#include <span>
#include <vector>

namespace fotomill {

// The data of a Pictor picture: run-length coded blocks, or uncompressed bytes. For the
// coding see pictor_runs.cpp.
class PictorData {
 public:
  // `blocks` is 0 for uncompressed data. Does not own `data`.
  PictorData(std::span<const uint8_t> data, uint32_t blocks) : data_(data), blocks_(blocks) {
    plain_ = blocks == 0;
  }
  // Fills `row` with the next bytes; false if there are not enough.
  [[nodiscard]] bool Next(std::span<uint8_t> row);

 private:
  bool NextBlock();
  bool NextRun();

  std::span<const uint8_t> data_;
  uint32_t blocks_;  // remaining blocks
  bool plain_ = false;
  size_t at_ = 0, end_ = 0;  // of the block
  uint8_t marker_ = 0;
  size_t run_ = 0;  // remaining repetitions of `value_`
  uint8_t value_ = 0;
};

// Maximum unpacked size of a block written here.
inline constexpr size_t kPictorBlock = 16384;
// Appends a block with header for at most kPictorBlock bytes.
void AppendPictorBlock(std::span<const uint8_t> bytes, std::vector<uint8_t>& code);

}  // namespace fotomill
