#include "platform/memory.h"

#include <malloc.h>
#include <sys/mman.h>

#include <algorithm>
#include <atomic>
#include <chrono>
#include <cstdlib>
#include <cstring>
#include <mutex>

#include "platform/fault.h"
#include "platform/freed_memory.h"

#if defined(__SANITIZE_ADDRESS__)
#define FOTOMILL_ADDRESS_SANITIZER 1
#elif defined(__has_feature)
#if __has_feature(address_sanitizer)
#define FOTOMILL_ADDRESS_SANITIZER 1
#endif
#endif
#ifdef FOTOMILL_ADDRESS_SANITIZER
#include <sanitizer/asan_interface.h>
#endif

namespace fotomill::platform {

std::atomic<int64_t> faultCountdown{0};

namespace {

constexpr uint64_t kPooledFrom = uint64_t{1} << 20;  // smaller blocks use malloc
constexpr uint64_t kHugePage = uint64_t{2} << 20;
constexpr uint64_t kSmallUnit = 64 * 1024;  // allocation unit of blocks below two huge pages
constexpr size_t kPooledBlocks = 16;
constexpr uint64_t kPooledBytes = uint64_t{512} << 20;
// If freed memory is returned to the system:
constexpr uint64_t kReturnedFrom = 256 * 1024;             // size of blocks that malloc maps
constexpr uint64_t kPooledAtRest = uint64_t{16} << 20;     // left in the pool
constexpr auto kTrimEvery = std::chrono::milliseconds(500);

std::atomic<bool> returnsMemory{false};
std::atomic<int64_t> trimmedAt{0};  // in units of kTrimEvery

#ifdef FOTOMILL_ADDRESS_SANITIZER
// The address sanitizer does not know mapped blocks: their accessible bytes are marked by hand, and
// each block has a guard zone after its end.
constexpr uint64_t kGuard = 4096;
void AllowBytes(const uint8_t* data, uint64_t size, uint64_t capacity) {
  __asan_unpoison_memory_region(data, size);
  __asan_poison_memory_region(data + size, capacity - size);
}
#else
constexpr uint64_t kGuard = 0;
void AllowBytes(const uint8_t*, uint64_t, uint64_t) {}
#endif

struct FreeBlock {
  uint8_t* data;
  uint64_t capacity;
};

// Free blocks, oldest first. Trivially destructible, so it outlives blocks held by statics.
struct BlockPool {
  std::mutex mutex;
  FreeBlock blocks[kPooledBlocks];
  size_t count;
  uint64_t bytes;

  FreeBlock Remove(size_t index) {
    const FreeBlock block = blocks[index];
    std::copy(blocks + index + 1, blocks + count, blocks + index);
    --count;
    bytes -= block.capacity;
    return block;
  }
};
constinit BlockPool pool{};

uint64_t RoundUp(uint64_t size, uint64_t unit) { return (size + unit - 1) / unit * unit; }

uint64_t CapacityFor(uint64_t size) {
  return RoundUp(size + kGuard, size >= 2 * kHugePage ? kHugePage : kSmallUnit);
}

void Unmap(FreeBlock block) {
  AllowBytes(block.data, block.capacity, block.capacity);
  munmap(block.data, static_cast<size_t>(block.capacity));
}

// Unmaps the oldest blocks until the pool holds at most `bytes`.
void ShrinkPool(uint64_t bytes) {
  for (;;) {
    FreeBlock block;
    {
      const std::lock_guard lock(pool.mutex);
      if (pool.count == 0 || pool.bytes <= bytes) return;
      block = pool.Remove(0);
    }
    Unmap(block);
  }
}

// The smallest pooled block that fits without wasting too much; data is null if there is none.
FreeBlock TakeFromPool(uint64_t capacity) {
  const std::lock_guard lock(pool.mutex);
  size_t best = pool.count;
  for (size_t i = 0; i < pool.count; ++i) {
    const uint64_t found = pool.blocks[i].capacity;
    const bool fits = found >= capacity && found / 2 <= capacity;
    if (fits && (best == pool.count || found < pool.blocks[best].capacity)) best = i;
  }
  return best == pool.count ? FreeBlock{nullptr, 0} : pool.Remove(best);
}

// Returns a block to the pool, or unmaps it if the pool is full.
void GiveToPool(FreeBlock block) {
  {
    const std::lock_guard lock(pool.mutex);
    if (pool.count < kPooledBlocks && pool.bytes + block.capacity <= kPooledBytes) {
      AllowBytes(block.data, 0, block.capacity);
      pool.blocks[pool.count++] = block;
      pool.bytes += block.capacity;
      return;
    }
  }
  Unmap(block);
}

// Maps fresh zero pages, huge ones if the block is large enough. Pooled blocks that did not fit are
// freed to make room, so that one large picture after many small ones does not add to them.
FreeBlock MapFresh(uint64_t capacity) {
  ShrinkPool(kPooledBytes - std::min(capacity, kPooledBytes));
  void* data = mmap(nullptr, static_cast<size_t>(capacity), PROT_READ | PROT_WRITE,
                    MAP_PRIVATE | MAP_ANONYMOUS, -1, 0);
  if (data == MAP_FAILED) {
    ShrinkPool(0);
    data = mmap(nullptr, static_cast<size_t>(capacity), PROT_READ | PROT_WRITE,
                MAP_PRIVATE | MAP_ANONYMOUS, -1, 0);
  }
  if (data == MAP_FAILED) return {nullptr, 0};
  if (capacity >= 2 * kHugePage) madvise(data, static_cast<size_t>(capacity), MADV_HUGEPAGE);
  return {static_cast<uint8_t*>(data), capacity};
}

}  // namespace

MemoryBlock& MemoryBlock::operator=(MemoryBlock&& other) noexcept {
  if (this != &other) {
    Free();
    data_ = std::exchange(other.data_, nullptr);
    size_ = std::exchange(other.size_, 0);
    capacity_ = std::exchange(other.capacity_, 0);
  }
  return *this;
}

bool MemoryBlock::Allocate(uint64_t size, Fill fill) {
  Free();
  if (size > SIZE_MAX / 2 || FaultDue()) return false;
  if (size < kPooledFrom) {
    const size_t bytes = size == 0 ? 1 : static_cast<size_t>(size);
    data_ = static_cast<uint8_t*>(fill == Fill::Zero ? std::calloc(bytes, 1) : std::malloc(bytes));
    if (data_ == nullptr) return false;
    size_ = size;
    return true;
  }
  const uint64_t capacity = CapacityFor(size);
  FreeBlock block = TakeFromPool(capacity);
  const bool used = block.data != nullptr;
  if (!used) block = MapFresh(capacity);
  if (block.data == nullptr) return false;
  AllowBytes(block.data, size, block.capacity);
  if (used && fill == Fill::Zero) std::memset(block.data, 0, static_cast<size_t>(size));
  data_ = block.data;
  capacity_ = block.capacity;
  size_ = size;
  return true;
}

bool MemoryBlock::Resize(uint64_t size) {
  const bool staysInPlace =
      size >= kPooledFrom && size + kGuard <= capacity_ && capacity_ / 2 <= CapacityFor(size);
  if (staysInPlace && !FaultDue()) {
    AllowBytes(data_, size, capacity_);
    if (size > size_) std::memset(data_ + size_, 0, static_cast<size_t>(size - size_));
    size_ = size;
    return true;
  }
  MemoryBlock other;
  if (staysInPlace || !other.Allocate(size, Fill::Unset)) return false;
  const uint64_t kept = std::min(size_, size);
  if (kept != 0) std::memcpy(other.data_, data_, static_cast<size_t>(kept));
  if (size > kept) std::memset(other.data_ + kept, 0, static_cast<size_t>(size - kept));
  *this = std::move(other);
  return true;
}

void MemoryBlock::Free() {
  if (data_ == nullptr) return;
  if (capacity_ == 0) {
    std::free(data_);
  } else {
    GiveToPool({data_, capacity_});
  }
  data_ = nullptr;
  size_ = capacity_ = 0;
}

void KeepFreedMemory() {
#ifdef __GLIBC__
  mallopt(M_MMAP_THRESHOLD, 4 * static_cast<int>(kPooledFrom));
  mallopt(M_TRIM_THRESHOLD, 16 * static_cast<int>(kPooledFrom));
#endif
}

void TrimMemoryPool() { ShrinkPool(0); }

void ReturnFreedMemory() {
  returnsMemory = true;
#ifdef __GLIBC__
  mallopt(M_ARENA_MAX, 2);
  mallopt(M_MMAP_THRESHOLD, static_cast<int>(kReturnedFrom));
  mallopt(M_TRIM_THRESHOLD, static_cast<int>(kReturnedFrom));
#endif
}

void TrimFreedMemory() {
  const int64_t now = std::chrono::steady_clock::now().time_since_epoch() / kTrimEvery;
  if (!returnsMemory || trimmedAt.exchange(now) == now) return;
  ShrinkPool(kPooledAtRest);
#ifdef __GLIBC__
  malloc_trim(0);
#endif
}

}  // namespace fotomill::platform
