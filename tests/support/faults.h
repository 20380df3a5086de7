#pragma once

#include <gtest/gtest.h>

#include <cstdint>
#include <string>

#include "platform/fault.h"

namespace fotomill::test {

// Runs `attempt` with its first operation on the system failing, then with its second, and so on
// until it meets no fault any more. `attempt` checks what must hold whether it failed or not.
// Returns how many operations were made to fail.
template <typename Attempt>
int64_t ForEachFault(Attempt attempt, int64_t most = 2000) {
  for (int64_t n = 1; n <= most; ++n) {
    SCOPED_TRACE("fault at operation " + std::to_string(n));
    platform::faultCountdown = n;
    attempt();
    const bool hit = platform::faultCountdown <= 0;
    platform::faultCountdown = 0;
    if (!hit) return n - 1;
  }
  ADD_FAILURE() << "still meets faults after " << most << " operations";
  return most;
}

}  // namespace fotomill::test
