#pragma once

#include <atomic>
#include <cstdint>

namespace fotomill::platform {

// Lets tests make the n-th operation on the system fail. Every open, create, read, write, sync,
// rename, lock and large allocation of this folder asks FaultDue() first and fails when it answers
// true. operations until the fault; 0 or less: none is planned
extern std::atomic<int64_t> faultCountdown;

// Counts one operation. True for the one that is to fail, and only for that.
inline bool FaultDue() {
  if (faultCountdown.load(std::memory_order_relaxed) <= 0) return false;
  return faultCountdown.fetch_sub(1, std::memory_order_relaxed) == 1;
}

}  // namespace fotomill::platform
