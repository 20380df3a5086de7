#pragma once

#include <algorithm>
#include <cstdint>
#include <cstring>
#include <span>
#include <string>
#include <string_view>

#include "platform/memory.h"
#include "platform/output_file.h"

namespace fotomill {

// Writes a new file front to back. Output is buffered and written in whole blocks, aligned to the
// block size, which is fastest on most systems. Larger blocks gain nothing, and are slow in virtual
// machines that must first get large free memory ranges back from the host. Write errors are
// sticky; check Failed() or Commit() once at the end. The file appears under its name only after a
// successful Commit; otherwise nothing is left behind.
class ByteWriter {
 public:
  // False if the file cannot be created there (status 10).
  [[nodiscard]] bool Create(const std::string& path) {
    return buffer_.Allocate(kBufferSize, platform::Fill::Unset) && file_.Create(path);
  }

  // These append at Position(): integers in the named
  // byte order, text without a terminating NUL.
  void U8(uint8_t value) { *Room(1) = value; }
  void Le16(uint16_t value) { Little(value, 2); }  // little-endian
  void Le32(uint32_t value) { Little(value, 4); }
  void Be16(uint16_t value) { Big(value, 2); }  // big-endian
  void Be32(uint32_t value) { Big(value, 4); }
  // Without a terminating NUL.
  void Text(std::string_view text) {
    Bytes({reinterpret_cast<const uint8_t*>(text.data()), text.size()});
  }
  // Padding.
  void Zeros(uint64_t count) {
    for (; count > 0; --count) U8(0);
  }
  void Bytes(std::span<const uint8_t> bytes) {
    while (!bytes.empty()) {
      while (used_ >= kBlock) FlushBlock();
      if (used_ == 0 && bytes.size() >= kBlock) {  // whole blocks are written without a copy
        Write(bytes.first(kBlock));
        bytes = bytes.subspan(kBlock);
        continue;
      }
      const size_t count = bytes.size() < kBlock - used_ ? bytes.size() : kBlock - used_;
      std::memcpy(buffer_.Data() + used_, bytes.data(), count);
      used_ += count;
      bytes = bytes.subspan(count);
    }
  }
  // Buffer space for up to `most` bytes (at most kMostReserved) for the caller to fill; Used() then
  // sets how many were filled.
  uint8_t* Reserve(size_t most) {
    while (kBufferSize - used_ < most) FlushBlock();
    return buffer_.Data() + used_;
  }
  void Used(size_t count) { used_ += count; }  // reserved bytes that were filled
  static constexpr size_t kMostReserved = 128 * 1024;

  // Bytes written so far.
  uint64_t Position() const { return flushed_ + used_; }
  // Overwrites bytes before Position(): in the file if they were flushed already, else
  // in the buffer.
  void Patch(uint64_t offset, std::span<const uint8_t> bytes) {
    if (offset < flushed_) {
      const auto inFile =
          bytes.first(static_cast<size_t>(std::min<uint64_t>(bytes.size(), flushed_ - offset)));
      failed_ = !file_.WriteAt(offset, inFile) || failed_;
      bytes = bytes.subspan(inFile.size());
      offset = flushed_;
    }
    if (!bytes.empty())
      std::memcpy(buffer_.Data() + (offset - flushed_), bytes.data(), bytes.size());
  }
  // Overwrites as Patch does.
  void PatchBe32(uint64_t offset, uint32_t value) {
    const uint8_t bytes[] = {static_cast<uint8_t>(value >> 24), static_cast<uint8_t>(value >> 16),
                             static_cast<uint8_t>(value >> 8), static_cast<uint8_t>(value)};
    Patch(offset, bytes);
  }
  // Overwrites as Patch does.
  void PatchLe32(uint64_t offset, uint32_t value) {
    const uint8_t bytes[] = {static_cast<uint8_t>(value), static_cast<uint8_t>(value >> 8),
                             static_cast<uint8_t>(value >> 16), static_cast<uint8_t>(value >> 24)};
    Patch(offset, bytes);
  }
  // Whether any write has failed; later output is discarded.
  bool Failed() const { return failed_; }

  // Flushes the buffer; nothing can be appended after that. False if any write has failed.
  [[nodiscard]] bool WriteRest() {
    while (used_ > kBlock) FlushBlock();
    if (used_ > 0) Write({buffer_.Data(), used_});
    used_ = 0;
    return !failed_;
  }
  // Flushes the buffer and renames the file to its final name.
  [[nodiscard]] platform::CommitResult Commit(platform::Existing existing, bool sync = false) {
    if (!WriteRest()) {
      file_.Discard();
      return platform::CommitResult::Failed;
    }
    return file_.Commit(existing, sync);
  }

 private:
  static constexpr size_t kBlock = 64 * 1024;
  static constexpr size_t kBufferSize = kBlock + kMostReserved;

  uint8_t* Room(size_t count) {
    uint8_t* room = Reserve(count);
    used_ += count;
    return room;
  }
  void Little(uint32_t value, unsigned count) {
    uint8_t* room = Room(count);
    for (unsigned i = 0; i < count; ++i) room[i] = static_cast<uint8_t>(value >> (8 * i));
  }
  void Big(uint32_t value, unsigned count) {
    uint8_t* room = Room(count);
    for (unsigned i = 0; i < count; ++i)
      room[i] = static_cast<uint8_t>(value >> (8 * (count - 1 - i)));
  }
  void Write(std::span<const uint8_t> bytes) {
    failed_ = !file_.Write(bytes) || failed_;
    flushed_ += bytes.size();
  }
  // Writes the first block of the buffer, which must hold at least one, and moves the remaining
  // bytes to the front.
  void FlushBlock() {
    Write({buffer_.Data(), kBlock});
    used_ -= kBlock;
    std::memmove(buffer_.Data(), buffer_.Data() + kBlock, used_);
  }

  platform::OutputFile file_;
  platform::MemoryBlock buffer_;
  size_t used_ = 0;
  uint64_t flushed_ = 0;  // bytes in the file, a multiple of kBlock
  bool failed_ = false;
};

}  // namespace fotomill
