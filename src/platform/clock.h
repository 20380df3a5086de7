#pragma once

#include <cstdint>

namespace fotomill::platform {

// Seconds since 1970-01-01 UTC. Tests may fix it; a negative value returns to the system's clock.
int64_t Now();
void FixNow(int64_t seconds);
// Seconds of a clock that never jumps, for rates and time left.
double MonotonicSeconds();

}  // namespace fotomill::platform
