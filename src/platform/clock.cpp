#include "platform/clock.h"

#include <atomic>
#include <chrono>

namespace fotomill::platform {

namespace {

std::atomic<int64_t> fixedNow{-1};

}  // namespace

int64_t Now() {
  const int64_t fixed = fixedNow.load();
  if (fixed >= 0) return fixed;
  return std::chrono::duration_cast<std::chrono::seconds>(
             std::chrono::system_clock::now().time_since_epoch())
      .count();
}

void FixNow(int64_t seconds) { fixedNow = seconds; }

double MonotonicSeconds() {
  return std::chrono::duration<double>(std::chrono::steady_clock::now().time_since_epoch()).count();
}

}  // namespace fotomill::platform
