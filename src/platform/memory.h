#pragma once

#include <cstddef>
#include <cstdint>
#include <span>
#include <type_traits>
#include <utility>

namespace fotomill::platform {

// Initial contents of a block. `Unset` is for
// owners that write every byte before reading any.
enum class Fill { Zero, Unset };

// A movable block of memory, owned by its holder. Large blocks come from a process-wide pool, so
// that a batch pays for fresh pages only once, and use huge pages.
class MemoryBlock {
 public:
  MemoryBlock() = default;
  MemoryBlock(MemoryBlock&& other) noexcept
      : data_(std::exchange(other.data_, nullptr)),
        size_(std::exchange(other.size_, 0)),
        capacity_(std::exchange(other.capacity_, 0)) {}
  MemoryBlock& operator=(MemoryBlock&& other) noexcept;
  MemoryBlock(const MemoryBlock&) = delete;
  MemoryBlock& operator=(const MemoryBlock&) = delete;
  ~MemoryBlock() { Free(); }

  // Replaces the block with one of `size` bytes. False, with the block empty, if memory runs out.
  [[nodiscard]] bool Allocate(uint64_t size, Fill fill = Fill::Zero);
  // Grows or shrinks, keeping the contents up to the smaller size; new bytes are zero. On false,
  // the block is unchanged.
  [[nodiscard]] bool Resize(uint64_t size);
  void Free();  // returns it to the pool or the system

  // Accessors; null and size 0 when nothing is allocated. Pointers and spans are valid until
  // Allocate, Resize or Free.
  bool Empty() const { return data_ == nullptr; }
  uint64_t Size() const { return size_; }  // bytes, 0 without a block
  uint8_t* Data() { return data_; }  // null without a block
  const uint8_t* Data() const { return data_; }
  std::span<uint8_t> Bytes() { return {data_, static_cast<size_t>(size_)}; }
  std::span<const uint8_t> Bytes() const { return {data_, static_cast<size_t>(size_)}; }
  // The bytes as an array of a trivial type.
  template <typename T>
  std::span<T> Items() {
    static_assert(std::is_trivially_copyable_v<T> && std::is_trivially_destructible_v<T>);
    return {reinterpret_cast<T*>(data_), static_cast<size_t>(size_) / sizeof(T)};
  }

 private:
  uint8_t* data_ = nullptr;
  uint64_t size_ = 0;
  uint64_t capacity_ = 0;  // bytes reserved: size_ rounded up to the pool's unit
};

// From now on, freed blocks below the pool's size stay with the process instead of being returned
// to the system one by one: a batch of small pictures then pays for fresh pages only once. For
// programs that exit when their work is done.
void KeepFreedMemory();

// Returns the pool's unused blocks to the system.
void TrimMemoryPool();

}  // namespace fotomill::platform
