#pragma once

#include <cstdint>
#include <functional>
#include <span>

namespace fotomill::platform {

// Memory that work apart shares with the program: what the work stores there is there afterwards. Zero at first.
class SharedBlock {
 public:
  SharedBlock() = default;
  ~SharedBlock();
  SharedBlock(const SharedBlock&) = delete;
  SharedBlock& operator=(const SharedBlock&) = delete;

  // False when there is no memory. Once for each block.
  [[nodiscard]] bool Allocate(uint64_t size);
  std::span<uint8_t> Bytes() { return {data_, static_cast<size_t>(size_)}; }
  std::span<const uint8_t> Bytes() const { return {data_, static_cast<size_t>(size_)}; }

 private:
  uint8_t* data_ = nullptr;
  uint64_t size_ = 0;
};

// How work apart ended.
enum class ApartResult {
  Done,        // the work answered true
  Failed,      // it answered false
  Broken,      // it crashed, or used more processor time than it was given
  NotStarted,  // the system has no room for it
};

// Runs work that may crash, such as a library that trusts its input, where it can do no harm: in a process of its own,
// which has a copy of everything, ends with the work, and leaves behind only what stands in shared blocks. The work
// must not take locks that other threads may hold (memory is fine). It may tell numbers, which `told` receives here
// meanwhile. `seconds` is the processor time that it may use.
ApartResult RunApart(const std::function<bool(const std::function<void(int32_t)>& tell)>& work, unsigned seconds,
                     const std::function<void(int32_t)>& told);

}  // namespace fotomill::platform
