#include "platform/memory.h"

#include <sys/mman.h>

#include <cstdlib>
#include <cstring>
#include <mutex>
#include <vector>

#include "platform/fault.h"

namespace fotomill::platform {

std::atomic<int64_t> faultCountdown{0};

namespace {

constexpr uint64_t kPooledFrom = uint64_t{1} << 20;  // smaller blocks are left to malloc
constexpr uint64_t kHugePage = uint64_t{2} << 20;
constexpr size_t kPooledBlocks = 16;
constexpr uint64_t kPooledBytes = uint64_t{512} << 20;

struct FreeBlock {
  uint8_t* data;
  uint64_t capacity;
};

std::mutex poolMutex;
std::vector<FreeBlock>& Pool() {
  static auto* pool = new std::vector<FreeBlock>;  // outlives every block that a static may hold
  return *pool;
}

uint64_t RoundUp(uint64_t size, uint64_t unit) { return (size + unit - 1) / unit * unit; }

// The smallest pooled block that is large enough without being wasteful; data is null when there is none.
FreeBlock TakeFromPool(uint64_t capacity) {
  const std::lock_guard lock(poolMutex);
  std::vector<FreeBlock>& pool = Pool();
  size_t best = pool.size();
  for (size_t i = 0; i < pool.size(); ++i) {
    const bool fits = pool[i].capacity >= capacity && pool[i].capacity / 2 <= capacity;
    if (fits && (best == pool.size() || pool[i].capacity < pool[best].capacity)) best = i;
  }
  if (best == pool.size()) return {nullptr, 0};
  const FreeBlock block = pool[best];
  pool.erase(pool.begin() + static_cast<std::ptrdiff_t>(best));
  return block;
}

// Keeps the block for later, or unmaps it when the pool holds enough.
void GiveToPool(FreeBlock block) {
  {
    const std::lock_guard lock(poolMutex);
    std::vector<FreeBlock>& pool = Pool();
    uint64_t held = block.capacity;
    for (const FreeBlock& other : pool) held += other.capacity;
    if (pool.size() < kPooledBlocks && held <= kPooledBytes) {
      pool.push_back(block);
      return;
    }
  }
  munmap(block.data, block.capacity);
}

// Fresh zero pages, asked to be huge ones where the block is worth it.
uint8_t* MapFresh(uint64_t capacity) {
  void* data = mmap(nullptr, capacity, PROT_READ | PROT_WRITE, MAP_PRIVATE | MAP_ANONYMOUS, -1, 0);
  if (data == MAP_FAILED) return nullptr;
  if (capacity >= 2 * kHugePage) madvise(data, capacity, MADV_HUGEPAGE);
  return static_cast<uint8_t*>(data);
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
  const uint64_t capacity = RoundUp(size, size >= 2 * kHugePage ? kHugePage : uint64_t{65536});
  FreeBlock block = TakeFromPool(capacity);
  if (block.data != nullptr) {
    if (fill == Fill::Zero) std::memset(block.data, 0, static_cast<size_t>(size));
  } else {
    block = {MapFresh(capacity), capacity};
    if (block.data == nullptr) return false;
  }
  data_ = block.data;
  capacity_ = block.capacity;
  size_ = size;
  return true;
}

bool MemoryBlock::Resize(uint64_t size) {
  MemoryBlock bigger;
  if (!bigger.Allocate(size)) return false;
  if (size_ != 0) std::memcpy(bigger.data_, data_, static_cast<size_t>(size_ < size ? size_ : size));
  *this = std::move(bigger);
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

void TrimMemoryPool() {
  const std::lock_guard lock(poolMutex);
  for (const FreeBlock& block : Pool()) munmap(block.data, block.capacity);
  Pool().clear();
}

}  // namespace fotomill::platform
