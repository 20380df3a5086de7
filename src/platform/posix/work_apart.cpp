#include "platform/work_apart.h"

#include <fcntl.h>
#include <sys/mman.h>
#include <sys/prctl.h>
#include <sys/resource.h>
#include <sys/wait.h>
#include <unistd.h>

#include <cerrno>
#include <csignal>

#include "platform/fault.h"
#include "platform/posix/handle.h"

namespace fotomill::platform {

namespace {

constexpr int kDone = 0, kFailed = 1;   // exit statuses of the process apart
constexpr int32_t kNoMore = INT32_MIN;  // told last: another process apart may hold the pipe open still

// What a crash must not set off here: files and texts that it writes about itself, and handlers that clean up after the
// program.
void PrepareChild(pid_t parent, unsigned seconds) {
  prctl(PR_SET_PDEATHSIG, SIGKILL);
  if (getppid() != parent) _exit(kFailed);
  const int nowhere = open("/dev/null", O_WRONLY | O_CLOEXEC);
  for (const int stream : {STDOUT_FILENO, STDERR_FILENO}) dup2(nowhere, stream);
  const rlimit none = {0, 0}, time = {seconds, seconds};
  setrlimit(RLIMIT_CORE, &none);
  setrlimit(RLIMIT_CPU, &time);
  for (const int signal : {SIGSEGV, SIGABRT, SIGFPE, SIGILL}) std::signal(signal, SIG_DFL);
  for (const int signal : {SIGINT, SIGTERM}) std::signal(signal, SIG_IGN);  // the program decides what becomes of its work
}

void Tell(int pipe, int32_t number) {
  while (write(pipe, &number, sizeof number) < 0 && errno == EINTR) {
  }
}

// Hands on numbers until the other side is closed.
void Listen(int pipe, const std::function<void(int32_t)>& told) {
  int32_t number = 0;
  for (;;) {
    const ssize_t size = read(pipe, &number, sizeof number);
    if (size == sizeof number && number != kNoMore) {
      told(number);
    } else if (size >= 0 || errno != EINTR) {
      return;
    }
  }
}

ApartResult ResultOf(pid_t child) {
  int status = 0;
  while (waitpid(child, &status, 0) < 0) {
    if (errno != EINTR) return ApartResult::Broken;
  }
  if (!WIFEXITED(status)) return ApartResult::Broken;
  const int exit = WEXITSTATUS(status);
  return exit == kDone ? ApartResult::Done : exit == kFailed ? ApartResult::Failed : ApartResult::Broken;
}

}  // namespace

SharedBlock::~SharedBlock() {
  if (data_ != nullptr) munmap(data_, static_cast<size_t>(size_));
}

bool SharedBlock::Allocate(uint64_t size) {
  if (FaultDue() || size == 0 || data_ != nullptr) return false;
  void* data = mmap(nullptr, static_cast<size_t>(size), PROT_READ | PROT_WRITE, MAP_SHARED | MAP_ANONYMOUS, -1, 0);
  if (data == MAP_FAILED) return false;
  data_ = static_cast<uint8_t*>(data);
  size_ = size;
  return true;
}

ApartResult RunApart(const std::function<bool(const std::function<void(int32_t)>& tell)>& work, unsigned seconds,
                     const std::function<void(int32_t)>& told) {
  int ends[2];
  if (FaultDue() || pipe2(ends, O_CLOEXEC) != 0) return ApartResult::NotStarted;
  const Handle reading(ends[0]);
  Handle writing(ends[1]);
  const pid_t parent = getpid(), child = fork();
  if (child < 0) return ApartResult::NotStarted;
  if (child == 0) {
    PrepareChild(parent, seconds);
    const bool done = work([&writing](int32_t number) { Tell(writing.Number(), number); });
    Tell(writing.Number(), kNoMore);
    _exit(done ? kDone : kFailed);
  }
  writing.Reset();
  Listen(reading.Number(), told);
  return ResultOf(child);
}

}  // namespace fotomill::platform
