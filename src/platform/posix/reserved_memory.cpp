#include "platform/reserved_memory.h"

#include <sys/mman.h>

#include "platform/fault.h"

namespace fotomill::platform {

ReservedMemory& ReservedMemory::operator=(ReservedMemory&& other) noexcept {
  if (this != &other) {
    Free();
    data_ = std::exchange(other.data_, nullptr);
    size_ = std::exchange(other.size_, 0);
  }
  return *this;
}

bool ReservedMemory::Reserve(uint64_t size) {
  if (size == 0 || size > SIZE_MAX / 2 || FaultDue()) return false;
  const auto bytes = static_cast<size_t>(size);
  void* data = mmap(nullptr, bytes, PROT_READ | PROT_WRITE,
                    MAP_PRIVATE | MAP_ANONYMOUS | MAP_NORESERVE, -1, 0);
  if (data == MAP_FAILED) return false;
#ifdef MADV_NOHUGEPAGE
  madvise(data, bytes, MADV_NOHUGEPAGE);  // otherwise touching one byte takes 2 MB
#endif
  Free();
  data_ = static_cast<uint8_t*>(data);
  size_ = size;
  return true;
}

void ReservedMemory::Free() {
  if (data_ != nullptr) munmap(std::exchange(data_, nullptr), static_cast<size_t>(size_));
  size_ = 0;
}

}  // namespace fotomill::platform
