#pragma once

#include <cstddef>
#include <cstdint>
#include <span>
#include <type_traits>
#include <utility>

namespace fotomill::platform {

// Much room of which little will be used: address space whose pages the system gives, zero and a
// small one at a time, when they are first touched, and takes back at once when the room is freed.
class ReservedMemory {
 public:
  ReservedMemory() = default;
  ReservedMemory(ReservedMemory&& other) noexcept
      : data_(std::exchange(other.data_, nullptr)), size_(std::exchange(other.size_, 0)) {}
  ReservedMemory& operator=(ReservedMemory&& other) noexcept;
  ~ReservedMemory() { Free(); }

  // Replaces the room by `size` zero bytes. False, with the room unchanged, if there is no address
  // space.
  [[nodiscard]] bool Reserve(uint64_t size);
  void Free();  // gives the address space back

  // Whether nothing is reserved, and how many bytes are.
  bool Empty() const { return data_ == nullptr; }
  uint64_t Size() const { return size_; }  // bytes
  // `count` plain structures from a byte offset on, which the caller keeps inside the room.
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
