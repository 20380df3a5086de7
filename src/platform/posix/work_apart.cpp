#include "platform/work_apart.h"

#include <fcntl.h>
#include <poll.h>
#include <spawn.h>
#include <sys/mman.h>
#include <sys/prctl.h>
#include <sys/resource.h>
#include <sys/socket.h>
#include <sys/stat.h>
#include <sys/wait.h>
#include <unistd.h>

#include <algorithm>
#include <array>
#include <cerrno>
#include <csignal>
#include <cstdlib>
#include <cstring>
#include <mutex>
#include <string>
#include <string_view>
#include <utility>
#include <vector>

#include "platform/clock.h"
#include "platform/fault.h"
#include "platform/posix/handle.h"
#include "platform/process.h"

// A worker process is this program started with the argument kServe, its parent's process id and
// its kind.
// Requests arrive on a socket, its only connection: an OrderHead, the request, and the handles of
// input and reply. It answers with Words, the last of which carries the result. It exits when the
// socket is closed.

extern char** environ;

namespace fotomill::platform {

namespace {

constexpr const char* kServe = "--work-apart";
constexpr int kSocket = 3;  // in the worker process
constexpr int kPatienceMs = 100;
constexpr int kClockFactor = 10;
constexpr size_t kMostIdle = 16;  // processes
constexpr rlim_t kMostWritten = rlim_t{4} << 30;  // bytes of a file that a module writes

struct OrderHead {
  std::array<char, 32> task{};
  uint32_t seconds = 0;
  uint32_t requestSize = 0;
  uint64_t memory = 0, inputSize = 0, replySize = 0;
};

struct Word {
  enum Kind : int32_t { Told, Ended } kind = Told;
  int32_t value = 0;  // of Ended: whether the task returned true
};

bool servesItself = false;

// --- in the worker process ---

std::string KindText(ApartKind kind) { return std::to_string(static_cast<int>(kind)); }

// No core dumps, no writing to files unless it is a writer; ends with its parent.
bool PrepareProcess(const char* parent, std::string_view kind) {
  prctl(PR_SET_PDEATHSIG, SIGKILL);
  if (std::to_string(getppid()) != parent) return false;
  const rlimit none = {0, 0}, written = {kMostWritten, kMostWritten};
  setrlimit(RLIMIT_CORE, &none);
  setrlimit(RLIMIT_FSIZE, kind == KindText(ApartKind::ModuleWriter) ? &written : &none);
  // the parent decides when to stop
  for (const int number : {SIGINT, SIGTERM}) std::signal(number, SIG_IGN);
  return true;
}

void LimitTime(unsigned seconds) {
  rusage used = {};
  getrusage(RUSAGE_SELF, &used);
  rlimit limit = {};
  getrlimit(RLIMIT_CPU, &limit);
  limit.rlim_cur = static_cast<rlim_t>(used.ru_utime.tv_sec + used.ru_stime.tv_sec + 1) + seconds;
  setrlimit(RLIMIT_CPU, &limit);
}

// Limits memory to that much beyond what is mapped now.
void LimitMemory(uint64_t bytes) {
#ifdef __SANITIZE_ADDRESS__
  (void)bytes;  // the sanitizer's shadow memory exceeds any limit
#else
  unsigned long pages = 0;
  if (const Handle file(open("/proc/self/statm", O_RDONLY | O_CLOEXEC)); file.IsOpen()) {
    char text[64] = {};
    if (read(file.Number(), text, sizeof text - 1) > 0) pages = std::strtoul(text, nullptr, 10);
  }
  rlimit limit = {};
  if (pages == 0 || getrlimit(RLIMIT_AS, &limit) != 0) return;
  limit.rlim_cur =
      std::min<rlim_t>(pages * static_cast<rlim_t>(sysconf(_SC_PAGESIZE)) + bytes, limit.rlim_max);
  setrlimit(RLIMIT_AS, &limit);
#endif
}

void FreeMemoryLimit() {
  rlimit limit = {};
  getrlimit(RLIMIT_AS, &limit);
  limit.rlim_cur = limit.rlim_max;
  setrlimit(RLIMIT_AS, &limit);
}

// Maps a block of the caller for one request.
class Mapping {
 public:
  Mapping(int handle, uint64_t size, int protection) : size_(static_cast<size_t>(size)) {
    if (size_ > 0) data_ = mmap(nullptr, size_, protection, MAP_SHARED, handle, 0);
  }
  ~Mapping() {
    if (Data() != nullptr) munmap(data_, size_);
  }
  Mapping(const Mapping&) = delete;
  Mapping& operator=(const Mapping&) = delete;
  bool Ok() const { return size_ == 0 || Data() != nullptr; }
  std::span<uint8_t> Bytes() const { return {Data(), Data() == nullptr ? 0 : size_}; }

 private:
  uint8_t* Data() const { return data_ == MAP_FAILED ? nullptr : static_cast<uint8_t*>(data_); }
  size_t size_;
  void* data_ = MAP_FAILED;
};

void Send(int socket, Word word) {
  while (send(socket, &word, sizeof word, MSG_NOSIGNAL) < 0 && errno == EINTR) {
  }
}

bool DoOrder(const OrderHead& head, std::span<const uint8_t> request, int input, int reply,
             std::span<const ApartTask> tasks) {
  const auto task = std::ranges::find_if(
      tasks, [&](const ApartTask& row) { return std::string_view(row.name) == head.task.data(); });
  const Mapping from(input, head.inputSize, PROT_READ),
      to(reply, head.replySize, PROT_READ | PROT_WRITE);
  if (task == tasks.end() || !from.Ok() || !to.Ok()) return false;
  LimitTime(head.seconds);
  LimitMemory(head.memory);
  bool done = false;
  try {
    done = task->run({request, from.Bytes(), to.Bytes(), [](int32_t number) {
                        Send(kSocket, {Word::Told, number});
                      }});
  } catch (...) {  // out of memory
  }
  FreeMemoryLimit();
  return done;
}

// The next request with its handles; false when the socket is closed.
bool Receive(std::vector<uint8_t>& message, std::array<int, 2>& handles) {
  message.resize(sizeof(OrderHead) + kMostRequest);
  alignas(cmsghdr) std::array<char, CMSG_SPACE(sizeof handles)> control{};
  iovec part = {message.data(), message.size()};
  msghdr header = {};
  header.msg_iov = &part;
  header.msg_iovlen = 1;
  header.msg_control = control.data();
  header.msg_controllen = control.size();
  ssize_t size = 0;
  while ((size = recvmsg(kSocket, &header, MSG_CMSG_CLOEXEC)) < 0 && errno == EINTR) {
  }
  const cmsghdr* rights = CMSG_FIRSTHDR(&header);
  if (size < static_cast<ssize_t>(sizeof(OrderHead)) || rights == nullptr ||
      rights->cmsg_len != CMSG_LEN(sizeof handles))
    return false;
  std::memcpy(handles.data(), CMSG_DATA(rights), sizeof handles);
  message.resize(static_cast<size_t>(size));
  return true;
}

int Serve(std::span<const ApartTask> tasks) {
  std::vector<uint8_t> message;
  std::array<int, 2> handles{};
  while (Receive(message, handles)) {
    const Handle input(handles[0]), reply(handles[1]);
    OrderHead head;
    std::memcpy(&head, message.data(), sizeof head);
    head.task.back() = 0;
    const std::span<const uint8_t> request = std::span<const uint8_t>(message).subspan(sizeof head);
    Send(kSocket, {Word::Ended, DoOrder(head, request, input.Number(), reply.Number(), tasks)});
  }
  return 0;
}

// --- in the parent ---

struct Process {
  pid_t id = -1;
  Handle socket;
  ApartKind kind = ApartKind::Own;

  bool Lives() const {
    pollfd state = {socket.Number(), POLLIN, 0};
    return poll(&state, 1, 0) == 0;  // an idle process sends nothing
  }
  // Kills it unless it has ended, and reaps it.
  void End() {
    kill(id, SIGKILL);
    while (waitpid(id, nullptr, 0) < 0 && errno == EINTR) {
    }
    socket.Reset();
  }
};

// Idle worker processes, ended with the program.
class IdleProcesses {
 public:
  ~IdleProcesses() { EndAll(); }
  // The one that was used last, since it has the most in memory.
  bool Take(ApartKind kind, Process& process) {
    const std::lock_guard lock(mutex_);
    for (size_t i = idle_.size(); i-- > 0;) {
      if (idle_[i].kind != kind) continue;
      process = std::move(idle_[i]);
      idle_.erase(idle_.begin() + static_cast<ptrdiff_t>(i));
      if (process.Lives()) return true;
      process.End();
    }
    return false;
  }
  void Keep(Process process) {
    const std::lock_guard lock(mutex_);
    if (idle_.size() < kMostIdle) return idle_.push_back(std::move(process));
    process.End();
  }
  void EndAll() {
    std::vector<Process> ended;
    {
      const std::lock_guard lock(mutex_);
      ended.swap(idle_);
    }
    for (Process& process : ended) process.End();
  }

 private:
  std::mutex mutex_;
  std::vector<Process> idle_;
};

IdleProcesses idleProcesses;

bool StartProcess(ApartKind kind, Process& process) {
  int ends[2];
  process.kind = kind;
  if (FaultDue() || socketpair(AF_UNIX, SOCK_SEQPACKET | SOCK_CLOEXEC, 0, ends) != 0) return false;
  process.socket.Reset(ends[0]);
  const Handle other(ends[1]);
  posix_spawn_file_actions_t actions;
  posix_spawnattr_t attributes;
  posix_spawn_file_actions_init(&actions);
  posix_spawnattr_init(&attributes);
  posix_spawn_file_actions_addopen(&actions, STDIN_FILENO, "/dev/null", O_RDONLY, 0);
  for (const int stream : {STDOUT_FILENO, STDERR_FILENO})
    posix_spawn_file_actions_addopen(&actions, stream, "/dev/null", O_WRONLY, 0);
  posix_spawn_file_actions_adddup2(&actions, other.Number(), kSocket);
  posix_spawn_file_actions_addclosefrom_np(&actions, kSocket + 1);
  posix_spawnattr_setflags(&attributes, POSIX_SPAWN_SETPGROUP);  // Ctrl-C goes to the parent only
  const std::string parent = std::to_string(getpid());
  std::string name = "fotomill", serve = kServe, number = parent, what = KindText(kind);
  char* const arguments[] = {name.data(), serve.data(), number.data(), what.data(), nullptr};
  const bool started =
      posix_spawn(&process.id, "/proc/self/exe", &actions, &attributes, arguments, environ) == 0;
  posix_spawn_file_actions_destroy(&actions);
  posix_spawnattr_destroy(&attributes);
  return started;
}

// The input of a process: a copy in memory, or an open file. Handle -1: none.
struct Input {
  SharedBlock block;
  Handle file;
  uint64_t size = 0;
  intptr_t SystemHandle() const { return file.IsOpen() ? file.Number() : block.SystemHandle(); }

  // False if memory runs out, or if it is not a readable regular file.
  bool Take(const ApartOrder& order) {
    if (!order.inputFile.empty()) {
      file.Reset(open(order.inputFile.c_str(), O_RDONLY | O_CLOEXEC | O_NONBLOCK));
      struct stat facts = {};
      if (!file.IsOpen() || fstat(file.Number(), &facts) != 0 || !S_ISREG(facts.st_mode))
        return false;
      size = static_cast<uint64_t>(facts.st_size);
      return true;
    }
    size = order.input.size();
    if (size == 0) return true;
    if (!block.Allocate(size)) return false;
    std::ranges::copy(order.input, block.Bytes().begin());
    return true;
  }
};

bool SendOrder(const Process& process, const ApartOrder& order, const Input& input) {
  OrderHead head;
  std::strncpy(head.task.data(), order.task, head.task.size() - 1);
  head.seconds = order.seconds;
  head.requestSize = static_cast<uint32_t>(order.request.size());
  head.memory = order.memory;
  head.inputSize = input.size;
  head.replySize = order.reply.Bytes().size();
  // Both are always sent; the worker ignores an empty input.
  const std::array<int, 2> handles = {
      static_cast<int>(input.size == 0 ? order.reply.SystemHandle() : input.SystemHandle()),
      static_cast<int>(order.reply.SystemHandle())};
  alignas(cmsghdr) std::array<char, CMSG_SPACE(sizeof handles)> control{};
  iovec parts[] = {{&head, sizeof head},
                   {const_cast<uint8_t*>(order.request.data()), order.request.size()}};
  msghdr message = {};
  message.msg_iov = parts;
  message.msg_iovlen = 2;
  message.msg_control = control.data();
  message.msg_controllen = control.size();
  cmsghdr* rights = CMSG_FIRSTHDR(&message);
  rights->cmsg_level = SOL_SOCKET;
  rights->cmsg_type = SCM_RIGHTS;
  rights->cmsg_len = CMSG_LEN(sizeof handles);
  std::memcpy(CMSG_DATA(rights), handles.data(), sizeof handles);
  return sendmsg(process.socket.Number(), &message, MSG_NOSIGNAL) >= 0;
}

ApartResult Await(const Process& process, const ApartOrder& order,
                  const std::function<void(int32_t)>& told) {
  const double until =
      MonotonicSeconds() +
      (order.patience > 0 ? double{1} * order.patience : double{kClockFactor} * order.seconds);
  while (MonotonicSeconds() < until) {
    if (PendingExit() != 0 || (order.goesOn && !order.goesOn())) return ApartResult::Stopped;
    pollfd state = {process.socket.Number(), POLLIN, 0};
    if (poll(&state, 1, kPatienceMs) <= 0) continue;
    Word word;
    const ssize_t size = recv(process.socket.Number(), &word, sizeof word, 0);
    if (size < 0 && errno == EINTR) continue;
    if (size != sizeof word) return ApartResult::Broken;
    if (word.kind == Word::Ended) return word.value != 0 ? ApartResult::Done : ApartResult::Failed;
    told(word.value);
  }
  return ApartResult::Broken;
}

}  // namespace

SharedBlock::~SharedBlock() {
  if (data_ != nullptr) munmap(data_, static_cast<size_t>(size_));
  if (handle_ >= 0) close(static_cast<int>(handle_));
}

bool SharedBlock::Allocate(uint64_t size) {
  if (FaultDue() || size == 0 || data_ != nullptr) return false;
  Handle memory(memfd_create("fotomill", MFD_CLOEXEC | MFD_ALLOW_SEALING));
  // Sealed against shrinking: accessing a truncated mapping would crash this process.
  if (!memory.IsOpen() || ftruncate(memory.Number(), static_cast<off_t>(size)) != 0) return false;
  (void)fcntl(memory.Number(), F_ADD_SEALS, F_SEAL_SHRINK | F_SEAL_GROW | F_SEAL_SEAL);
  void* data = mmap(nullptr, static_cast<size_t>(size), PROT_READ | PROT_WRITE, MAP_SHARED,
                    memory.Number(), 0);
  if (data == MAP_FAILED) return false;
  data_ = static_cast<uint8_t*>(data);
  size_ = size;
  handle_ = memory.Release();
  return true;
}

std::optional<int> ServeApart(int count, const char* const* arguments,
                              std::span<const ApartTask> tasks) {
  if (count != 4 || std::string_view(arguments[1]) != kServe) {
    servesItself = true;
    return std::nullopt;
  }
  return PrepareProcess(arguments[2], arguments[3]) ? Serve(tasks) : 1;
}

ApartResult RunApart(const ApartOrder& order, const std::function<void(int32_t)>& told) {
  if (!servesItself || order.request.size() > kMostRequest) return ApartResult::NotStarted;
  Input input;
  if (!input.Take(order)) return ApartResult::NotStarted;
  Process process;
  if (!idleProcesses.Take(order.kind, process) && !StartProcess(order.kind, process))
    return ApartResult::NotStarted;
  const ApartResult result =
      SendOrder(process, order, input) ? Await(process, order, told) : ApartResult::Broken;
  if (result == ApartResult::Done || result == ApartResult::Failed) {
    idleProcesses.Keep(std::move(process));
  } else {
    process.End();
  }
  return result;
}

void EndIdleProcesses() { idleProcesses.EndAll(); }

}  // namespace fotomill::platform
