#pragma once

#include <array>
#include <cstdint>
#include <span>
#include <string_view>

#include "platform/file_view.h"

namespace fotomill {

// The input of a container walk: a file in memory, or one of which
// only the head is. Beyond the head, bytes are read on demand, at
// no more than limits.walkedPlaces offsets. Owns neither.
class WalkedBytes {
 public:
  WalkedBytes(std::span<const uint8_t> file) : held_(file), size_(file.size()) {}
  explicit WalkedBytes(const platform::FileView& head)
      : held_(head.Bytes()), size_(head.FileSize()), file_(&head) {}

  static constexpr uint64_t kMost = 16;
  // Of the whole file, in bytes.
  uint64_t Size() const { return size_; }
  // `count` bytes from `offset`, at most kMost, fewer at the end. Bytes that are not in memory are
  // valid until the next call.
  std::span<const uint8_t> At(uint64_t offset, uint64_t count);
  // Whether a read error occurred.
  bool Failed() const { return failed_; }

 private:
  std::span<const uint8_t> held_;
  uint64_t size_ = 0;
  const platform::FileView* file_ = nullptr;
  std::array<uint8_t, kMost> read_ = {};
  uint32_t places_ = 0;  // offsets read so far
  bool failed_ = false;
};

// Bytes as text, such as a chunk's name.
inline std::string_view TextOf(std::span<const uint8_t> bytes) {
  return {static_cast<const char*>(static_cast<const void*>(bytes.data())), bytes.size()};
}

}  // namespace fotomill
