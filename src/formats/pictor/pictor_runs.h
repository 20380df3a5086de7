#pragma once

#include <cstddef>
#include <cstdint>
#include <span>
#include <vector>

namespace fotomill {

// The data of a Pictor picture: blocks of run-length code, or plain bytes. The code is described in
// pictor_runs.cpp.
class PictorData {
 public:
  // `blocks` of 0 means plain bytes. Does not own `data`.
  PictorData(std::span<const uint8_t> data, uint32_t blocks) : data_(data), blocks_(blocks) {
    plain_ = blocks == 0;
  }
  // Fills `row` with the next bytes; false when there are not enough.
  [[nodiscard]] bool Next(std::span<uint8_t> row);

 private:
  bool NextBlock();
  bool NextRun();

  std::span<const uint8_t> data_;
  uint32_t blocks_;  // that are left
  bool plain_ = false;
  size_t at_ = 0, end_ = 0;  // of the block
  uint8_t marker_ = 0;
  size_t run_ = 0;  // bytes of `value_` still to be given
  uint8_t value_ = 0;
};

// The most bytes in a block of ours, unpacked.
inline constexpr size_t kPictorBlock = 16384;
// A block of at most kPictorBlock bytes in code, with its head.
void AppendPictorBlock(std::span<const uint8_t> bytes, std::vector<uint8_t>& code);

}  // namespace fotomill
