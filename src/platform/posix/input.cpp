#include "platform/input.h"

#include <fcntl.h>
#include <poll.h>
#include <unistd.h>

#include <cerrno>

#include "platform/fault.h"
#include "platform/posix/handle.h"
#include "platform/posix/kept_reason.h"
#include "platform/process.h"
#include "platform/reason.h"

namespace fotomill::platform {

namespace {

// Waits for data or the end of input; false if the program was asked to end.
bool WaitFor(int handle) {
  constexpr int kPatienceMs = 100;  // limits the delay of a signal that arrives just before poll()
  pollfd input = {handle, POLLIN, 0};
  while (PendingExit() == 0) {
    if (poll(&input, 1, kPatienceMs) > 0) return true;
  }
  return false;
}

std::optional<size_t> ReadSome(int handle, std::span<uint8_t> buffer) {
  while (!FaultDue() && WaitFor(handle)) {
    const ssize_t count = read(handle, buffer.data(), buffer.size());
    if (count >= 0) return static_cast<size_t>(count);
    if (errno != EINTR && errno != EAGAIN) break;
  }
  KeepErrno();
  return std::nullopt;
}

}  // namespace

std::optional<size_t> ReadInput(std::span<uint8_t> buffer) {
  ForgetReason();
  return ReadSome(STDIN_FILENO, buffer);
}

// A blocking open of a FIFO would wait for a writer; opened non-blocking, the first read waits.
ReadResult ReadListFile(const std::string& path, uint64_t most, std::string& contents) {
  contents.clear();
  ForgetReason();
  const Handle file = OpenHandle(path.c_str(), O_RDONLY | O_NONBLOCK | O_NOCTTY);
  if (!file.IsOpen()) {
    KeepErrno();
    return errno == ENOENT ? ReadResult::Missing : ReadResult::Failed;
  }
  uint8_t buffer[16384];
  for (;;) {
    const auto count = ReadSome(file.Number(), buffer);
    if (count == size_t{0}) return ReadResult::Done;
    if (count) contents.append(reinterpret_cast<const char*>(buffer), *count);
    if (count && contents.size() <= most) continue;
    contents.clear();
    return count ? ReadResult::TooLarge : ReadResult::Failed;
  }
}

}  // namespace fotomill::platform
