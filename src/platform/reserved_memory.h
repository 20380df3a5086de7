#pragma once

#include <cstddef>
#include <cstdint>
#include <span>
#include <type_traits>
#include <utility>

namespace fotomill::platform {

// A large, sparsely used block of memory: reserved address space whose pages the system allocates,
// zeroed and small, at first access, and reclaims when the block is freed.
class ReservedMemory {
 public:
  ReservedMemory() = default;
  ReservedMemory(ReservedMemory&& other) noexcept
      : data_(std::exchange(other.data_, nullptr)), size_(std::exchange(other.size_, 0)) {}
  ReservedMemory& operator=(ReservedMemory&& other) noexcept;
  ~ReservedMemory() { Free(); }

  // Replaces the block with `size` zero bytes. False, with the block unchanged, if address space
  // runs out.
  [[nodiscard]] bool Reserve(uint64_t size);
  void Free();  // releases the address space

  // Whether nothing is reserved; and the size.
  bool Empty() const { return data_ == nullptr; }
  uint64_t Size() const { return size_; }  // bytes
  // `count` plain structs from a byte offset on; the caller keeps them within the block.
  template <typename T>
  std::span<T> Items(uint64_t offset, size_t count) {
    static_assert(std::is_trivially_copyable_v<T> && std::is_trivially_destructible_v<T>);
    return {reinterpret_cast<T*>(data_ + offset), count};
  }

 private:
  uint8_t* data_ = nullptr;
  uint64_t size_ = 0;
};

}  // namespace fotomill::platform
