// The run-length code of Pictor files, little-endian. A block:
//
//   offset size  field
//        0    2  its size, including this header
//        2    2  unpacked size
//        4    1  marker
//        5       literal bytes; or the marker, a count from 1 (1 byte) and the byte to repeat; or
//                the marker, 0, a count (2 bytes) and the byte
//
// The writer ends runs with the block; the reader accepts runs across blocks.
// Source: J. Bridges, "Pictor/PC Paint Format" (1988), in Murray and vanRyper, Encyclopedia of
// Graphics File Formats (1996).
#include "formats/pictor/pictor_runs.h"

#include <algorithm>
#include <array>
#include <cstring>

namespace fotomill {

namespace {

constexpr size_t kHead = 5, kShortestRun = 4, kMostShortRun = 255;

void AppendLe16(size_t value, std::vector<uint8_t>& code) {
  code.push_back(static_cast<uint8_t>(value));
  code.push_back(static_cast<uint8_t>(value >> 8));
}

}  // namespace

bool PictorData::NextBlock() {
  if (blocks_ == 0 || data_.size() - end_ < kHead) return false;
  --blocks_;
  const size_t length = data_[end_] | size_t{data_[end_ + 1]} << 8;
  marker_ = data_[end_ + 4];
  at_ = end_ + kHead;
  end_ = std::min(data_.size(), end_ + std::max(length, kHead));
  return true;
}

// Leaves at least one byte in `run_`.
bool PictorData::NextRun() {
  while (at_ == end_) {
    if (!NextBlock()) return false;
  }
  run_ = 1;
  value_ = data_[at_++];
  if (value_ != marker_) return true;
  if (end_ - at_ < 2) return false;
  run_ = data_[at_++];
  if (run_ == 0) {
    if (end_ - at_ < 3) return false;
    run_ = data_[at_] | size_t{data_[at_ + 1]} << 8;
    at_ += 2;
  }
  value_ = data_[at_++];
  return true;
}

bool PictorData::Next(std::span<uint8_t> row) {
  if (plain_) {
    if (data_.size() - at_ < row.size()) return false;
    std::memcpy(row.data(), &data_[at_], row.size());
    at_ += row.size();
    return true;
  }
  size_t x = 0;
  while (x < row.size()) {
    if (run_ == 0) {
      // bytes up to the next marker are literals
      const size_t most = std::min(end_ - at_, row.size() - x);
      const void* found = most == 0 ? nullptr : std::memchr(&data_[at_], marker_, most);
      const size_t count =
          found == nullptr ? most
                           : static_cast<size_t>(static_cast<const uint8_t*>(found) - &data_[at_]);
      if (count > 0) {
        std::memcpy(&row[x], &data_[at_], count);
        at_ += count;
        x += count;
        continue;
      }
      if (!NextRun()) return false;
    }
    const size_t count = std::min(run_, row.size() - x);
    std::memset(&row[x], value_, count);
    run_ -= count;
    x += count;
  }
  return true;
}

void AppendPictorBlock(std::span<const uint8_t> bytes, std::vector<uint8_t>& code) {
  std::array<uint32_t, 256> uses = {};
  for (const uint8_t byte : bytes) ++uses[byte];
  const auto marker = static_cast<uint8_t>(std::ranges::min_element(uses) - uses.begin());
  const size_t begin = code.size();
  AppendLe16(0, code);
  AppendLe16(bytes.size(), code);
  code.push_back(marker);
  for (size_t at = 0; at < bytes.size();) {
    const uint8_t value = bytes[at];
    size_t end = at + 1;
    while (end < bytes.size() && bytes[end] == value) ++end;
    const size_t run = end - at;
    at = end;
    if (run < kShortestRun && value != marker) {
      code.insert(code.end(), run, value);
      continue;
    }
    code.push_back(marker);
    if (run <= kMostShortRun) {
      code.push_back(static_cast<uint8_t>(run));
    } else {
      code.push_back(0);
      AppendLe16(run, code);
    }
    code.push_back(value);
  }
  const size_t length = code.size() - begin;
  code[begin] = static_cast<uint8_t>(length);
  code[begin + 1] = static_cast<uint8_t>(length >> 8);
}

}  // namespace fotomill
