#pragma once

#include <atomic>
#include <cstdint>

namespace fotomill::platform {

// Fault injection for tests: makes the n-th system operation fail. Every open, create, read, write,
// sync, rename, lock and large allocation in this folder calls FaultDue() first and fails if it
// returns true. Counts operations until the fault; 0 or less: disabled.
extern std::atomic<int64_t> faultCountdown;

// Counts one operation. True only for the one that must fail.
inline bool FaultDue() {
  if (faultCountdown.load(std::memory_order_relaxed) <= 0) return false;
  return faultCountdown.fetch_sub(1, std::memory_order_relaxed) == 1;
}

}  // namespace fotomill::platform
