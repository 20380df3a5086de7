#include "platform/module_memory.h"

#include <malloc.h>

#include <cstdlib>
#include <cstring>

#include "platform/fault.h"

namespace fotomill::platform {

std::span<uint8_t> LockModuleBlock(void* handle) {
  if (handle == nullptr || FaultDue()) return {};
  return {static_cast<uint8_t*>(handle), malloc_usable_size(handle)};
}

void UnlockModuleBlock(void*) {}

void FreeModuleBlock(void* handle) { std::free(handle); }

void* NewModuleMemory(uint64_t bytes) {
  return FaultDue() || bytes > SIZE_MAX / 2 ? nullptr : std::malloc(static_cast<size_t>(bytes) + 1);
}

void* NewModuleBlock(std::span<const uint8_t> bytes) {
  void* block = FaultDue() ? nullptr : std::malloc(bytes.size() + 1);
  if (block != nullptr) std::memcpy(block, bytes.data(), bytes.size());
  return block;
}

}  // namespace fotomill::platform
