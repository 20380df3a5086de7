#include "platform/posix/temporary_names.h"

#include <unistd.h>

#include <algorithm>
#include <atomic>
#include <cerrno>

namespace fotomill::platform {

namespace {

constexpr size_t kLongestName = 4096;

struct Slot {
  enum State { Free, Writing, Listed };
  std::atomic<int> state{Free};
  char name[kLongestName] = {};
};
constinit Slot slots[64];  // zero-initialized: no pages are touched until a name is added
static_assert(std::atomic<int>::is_always_lock_free,
              "the handler may only touch lock-free objects");

}  // namespace

int EnterTemporaryName(const std::string& path) {
  if (path.size() >= kLongestName) return -1;
  for (Slot& slot : slots) {
    int expected = Slot::Free;
    if (!slot.state.compare_exchange_strong(expected, Slot::Writing)) continue;
    std::copy_n(path.c_str(), path.size() + 1, slot.name);
    slot.state = Slot::Listed;
    return static_cast<int>(&slot - slots);
  }
  return -1;
}

void LeaveTemporaryName(int number) {
  if (number >= 0) slots[number].state = Slot::Free;
}

void DeleteListedTemporaries() {
  const int saved = errno;
  for (const Slot& slot : slots) {
    if (slot.state == Slot::Listed) unlink(slot.name);
  }
  errno = saved;
}

}  // namespace fotomill::platform
