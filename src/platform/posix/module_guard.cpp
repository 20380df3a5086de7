#include "platform/module_guard.h"

#include <fcntl.h>
#include <signal.h>
#include <sys/stat.h>
#include <unistd.h>

#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <iterator>
#include <mutex>
#include <utility>

#include "platform/posix/temporary_names.h"

namespace fotomill::platform {

namespace {

// Read by signal handlers on the same thread; trivially destructible, so that it is still valid
// when exit() runs its handlers.
constinit thread_local const ModuleRisk* current = nullptr;

constexpr int kCrashes[] = {SIGSEGV, SIGBUS, SIGFPE, SIGILL, SIGABRT};
struct sigaction previous[std::size(kCrashes)];

void WriteLine(int file, const std::string& line) {
  if (write(file, line.data(), line.size()) < 0 || write(file, "\n", 1) < 0) return;
}

// Async-signal-safe calls only.
void SayFarewell(const ModuleRisk& risk) {
  WriteLine(STDERR_FILENO, risk.message);
  DeleteListedTemporaries();
  if (risk.recordFile.empty()) return;
  const int file = open(risk.recordFile.c_str(),
                        O_WRONLY | O_CREAT | O_APPEND | O_NOFOLLOW | O_NONBLOCK | O_CLOEXEC, 0644);
  if (file < 0) return;
  WriteLine(file, risk.record);
  close(file);
}

void OnCrash(int signalNumber, siginfo_t* info, void* context);

// Whether the previous handler could repair the access. If it cannot, it reinstalls
// its own predecessor.
bool RepairedBefore(size_t index, siginfo_t* info, void* context) {
  const struct sigaction& before = previous[index];
  if ((before.sa_flags & SA_SIGINFO) == 0 || before.sa_sigaction == nullptr) return false;
  before.sa_sigaction(kCrashes[index], info, context);
  struct sigaction now = {};
  return sigaction(kCrashes[index], nullptr, &now) == 0 && (now.sa_flags & SA_SIGINFO) != 0 &&
         now.sa_sigaction == OnCrash;
}

void OnCrash(int signalNumber, siginfo_t* info, void* context) {
  size_t index = 0;
  while (kCrashes[index] != signalNumber) ++index;
  if (RepairedBefore(index, info, context)) return;
  if (const ModuleRisk* risk = std::exchange(current, nullptr)) SayFarewell(*risk);
  signal(signalNumber, SIG_DFL);
  raise(signalNumber);  // delivered when this handler returns
}

void OnExit() {
  const ModuleRisk* const risk = std::exchange(current, nullptr);
  if (risk == nullptr) return;
  std::fflush(nullptr);
  SayFarewell(*risk);
  _exit(EXIT_FAILURE);
}

void Install() {
  for (size_t i = 0; i < std::size(kCrashes); ++i) {
    struct sigaction action = {};
    action.sa_sigaction = OnCrash;
    action.sa_flags = SA_SIGINFO | SA_ONSTACK;
    sigemptyset(&action.sa_mask);
    sigaction(kCrashes[i], &action, &previous[i]);
  }
  (void)std::atexit(OnExit);
  (void)std::at_quick_exit(OnExit);
}

}  // namespace

ModuleGuard::ModuleGuard(ModuleRisk risk) : risk_(std::move(risk)), before_(current) {
  static std::once_flag once;
  std::call_once(once, Install);
  current = &risk_;
}

ModuleGuard::~ModuleGuard() { current = before_; }

OwnCode::OwnCode() : before_(std::exchange(current, nullptr)) {}

OwnCode::~OwnCode() { current = before_; }

}  // namespace fotomill::platform
