#include "platform/process.h"

#include <fcntl.h>
#include <poll.h>
#include <sched.h>
#include <signal.h>
#include <spawn.h>
#include <sys/ioctl.h>
#include <sys/stat.h>
#include <sys/wait.h>
#include <termios.h>
#include <unistd.h>

#include <algorithm>
#include <atomic>
#include <cerrno>
#include <cstdlib>
#include <string_view>
#include <system_error>
#include <thread>

#include "platform/fault.h"
#include "platform/files.h"
#include "platform/folders.h"
#include "platform/paths.h"
#include "platform/posix/temporary_names.h"

extern char** environ;

namespace fotomill::platform {

namespace {

std::atomic<int> pendingExit{0};
static_assert(std::atomic<int>::is_always_lock_free,
              "the handler may only touch lock-free objects");

void OnTermination(int signalNumber) {
  int none = 0;
  if (pendingExit.compare_exchange_strong(none, 128 + signalNumber)) return;
  DeleteListedTemporaries();
  signal(signalNumber, SIG_DFL);
  raise(signalNumber);  // delivered when this handler returns
}

bool IsProgram(const std::string& path) {
  return IsRegularFile(path) && access(path.c_str(), X_OK) == 0;
}

// The path of a program given by name or path; empty if there is none.
std::string FindProgram(const std::string& name) {
  if (name.find('/') != std::string::npos) return IsProgram(name) ? name : std::string();
  const char* path = std::getenv("PATH");
  if (name.empty() || path == nullptr) return {};
  for (std::string_view rest = path; !rest.empty();) {
    const std::string_view folder = rest.substr(0, rest.find(':'));
    rest.remove_prefix(folder.size() == rest.size() ? rest.size() : folder.size() + 1);
    if (!folder.starts_with('/')) continue;
    std::string program = JoinFolder(folder, name);
    if (IsProgram(program)) return program;
  }
  return {};
}

int WaitFor(pid_t child) {
  int status = 0;
  while (waitpid(child, &status, 0) < 0 && errno == EINTR) {
  }
  return status;
}

// posix_spawn's two attribute objects.
struct SpawnSettings {
  posix_spawn_file_actions_t actions;
  posix_spawnattr_t attributes;
  SpawnSettings() {
    posix_spawn_file_actions_init(&actions);
    posix_spawnattr_init(&attributes);
  }
  SpawnSettings(const SpawnSettings&) = delete;
  SpawnSettings& operator=(const SpawnSettings&) = delete;
  ~SpawnSettings() {
    posix_spawn_file_actions_destroy(&actions);
    posix_spawnattr_destroy(&attributes);
  }
  void Detach() {
    posix_spawn_file_actions_addopen(&actions, STDIN_FILENO, "/dev/null", O_RDONLY, 0);
    posix_spawn_file_actions_addopen(&actions, STDOUT_FILENO, "/dev/null", O_WRONLY, 0);
    posix_spawnattr_setflags(&attributes, POSIX_SPAWN_SETSID);
  }
};

}  // namespace

std::vector<std::string> ProgramFor(const std::string& file) {
  std::string opener = FindProgram("xdg-open");  // opens with the desktop's default program
  if (opener.empty()) return {};
  // absolute, as a name may start with "-" or look like a URL
  return {std::move(opener), AbsolutePath(file)};
}

namespace {

// The process of a started program; 0 if it cannot be started.
pid_t Start(const std::vector<std::string>& arguments, bool detached) {
  if (arguments.empty() || FaultDue()) return 0;
  const std::string program = FindProgram(arguments[0]);
  if (program.empty()) return 0;
  std::vector<char*> vector;
  for (const std::string& argument : arguments)
    vector.push_back(const_cast<char*>(argument.c_str()));
  vector.push_back(nullptr);
  SpawnSettings settings;
  if (detached) settings.Detach();
  pid_t child;
  const int error = posix_spawn(&child, program.c_str(), &settings.actions, &settings.attributes,
                                vector.data(), environ);
  return error == 0 ? child : 0;
}

}  // namespace

bool RunProgram(const std::vector<std::string>& arguments, bool wait) {
  const pid_t child = Start(arguments, !wait);
  if (child == 0) return false;
  if (wait) {
    WaitFor(child);
    return true;
  }
  try {
    std::thread(WaitFor, child).detach();  // reaps the child
  } catch (const std::system_error&) {
  }
  return true;
}

std::optional<int> RunAndWait(const std::vector<std::string>& arguments) {
  const pid_t child = Start(arguments, false);
  if (child == 0) return std::nullopt;
  constexpr int kShortestMs = 2, kLongestMs = 50, kGraceMs = 500;
  int status = 0, pause = kShortestMs, asked = 0;  // asked: milliseconds since it was told to end
  while (true) {
    const pid_t ended = waitpid(child, &status, WNOHANG);
    if (ended == child) break;
    if (ended < 0 && errno != EINTR) return std::nullopt;
    if (PendingExit() != 0) {
      if (asked == 0 || asked > kGraceMs) kill(child, asked == 0 ? SIGTERM : SIGKILL);
      asked += pause;
    }
    (void)poll(nullptr, 0, pause);
    pause = std::min(2 * pause, kLongestMs);
  }
  return WIFEXITED(status) ? std::optional(WEXITSTATUS(status)) : std::nullopt;
}

void FillStandardStreams() {
  for (const int stream : {STDIN_FILENO, STDOUT_FILENO, STDERR_FILENO}) {
    // The lowest free descriptor is used. It is read-only, so that writes to it fail.
    if (fcntl(stream, F_GETFD) < 0) (void)open("/dev/null", O_RDONLY);
  }
}

bool IsTerminal(int stream) { return isatty(stream) == 1; }

bool IsReaderGone(int stream) {
  pollfd output = {stream, 0, 0};
  struct stat facts;
  return fstat(stream, &facts) == 0 && (S_ISFIFO(facts.st_mode) || S_ISSOCK(facts.st_mode)) &&
         poll(&output, 1, 0) > 0 && (output.revents & (POLLERR | POLLHUP)) != 0;
}

bool IsStored(int stream) {
  struct stat facts;
  return fstat(stream, &facts) == 0 && S_ISREG(facts.st_mode);
}

bool WaitForInput() {
  constexpr int kPatienceMs = 100;  // limits the delay of a signal that arrives just before poll()
  pollfd input = {STDIN_FILENO, POLLIN, 0};
  while (PendingExit() == 0) {
    if (poll(&input, 1, kPatienceMs) > 0) return true;
  }
  return false;
}

bool ShowTyping(bool show) {
  termios modes;
  if (tcgetattr(STDIN_FILENO, &modes) != 0) return false;
  modes.c_lflag = show ? modes.c_lflag | ECHO : modes.c_lflag & ~static_cast<tcflag_t>(ECHO);
  return tcsetattr(STDIN_FILENO, TCSAFLUSH, &modes) == 0;
}

void SetVariable(const char* name, const std::string& value) {
  (void)setenv(name, value.c_str(), 1);
}

int TerminalWidth() {
  for (const int stream : {STDERR_FILENO, STDOUT_FILENO}) {
    winsize size = {};
    if (ioctl(stream, TIOCGWINSZ, &size) == 0 && size.ws_col > 0) return size.ws_col;
  }
  const char* columns = std::getenv("COLUMNS");
  const long width = columns != nullptr ? std::strtol(columns, nullptr, 10) : 0;
  return width > 0 && width <= 10000 ? static_cast<int>(width) : 80;
}

unsigned CoreCount() {
  cpu_set_t cores;
  if (sched_getaffinity(0, sizeof cores, &cores) == 0 && CPU_COUNT(&cores) > 0)
    return static_cast<unsigned>(CPU_COUNT(&cores));
  const unsigned count = std::thread::hardware_concurrency();
  return count > 0 ? count : 1;
}

void CatchTermination() {
  for (const int signalNumber : {SIGINT, SIGTERM}) {
    struct sigaction old = {};
    if (sigaction(signalNumber, nullptr, &old) != 0 || old.sa_handler == SIG_IGN) continue;
    struct sigaction action = {};
    action.sa_handler = OnTermination;
    action.sa_flags = SA_RESTART;
    sigemptyset(&action.sa_mask);
    sigaction(signalNumber, &action, nullptr);
  }
  signal(SIGPIPE, SIG_IGN);
}

int PendingExit() { return pendingExit.load(std::memory_order_relaxed); }

}  // namespace fotomill::platform
