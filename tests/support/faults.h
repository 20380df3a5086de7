#pragma once

#include <gtest/gtest.h>

#include <cstdint>
#include <string>

#include "platform/fault.h"

namespace fotomill::test {

// Runs `attempt` with the first system operation failing, then with
// the second, and so on until no fault occurs. `attempt` checks
// what must hold in either case. Returns the number of faults.
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
