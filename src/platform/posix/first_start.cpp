#include "platform/first_start.h"

#include <fcntl.h>
#include <poll.h>
#include <sys/file.h>
#include <sys/socket.h>
#include <sys/stat.h>
#include <sys/un.h>
#include <unistd.h>

#include <cerrno>
#include <chrono>
#include <cmath>
#include <cstdlib>
#include <cstring>
#include <optional>
#include <system_error>

#include "platform/clock.h"
#include "platform/posix/handle.h"

// The first instance locks the file NAME.lock in a folder only the user can access, and listens on
// the socket NAME in that folder. Later instances send their message, shut down sending, and
// receive a byte once it is accepted. The lock ends with its process, however that ends; a leftover
// socket is replaced by the next instance that gets the lock.

namespace fotomill::platform {

namespace {

constexpr size_t kMostMessage = 1 << 16;
constexpr int kPollMs = 20;         // between attempts
constexpr double kSendSeconds = 2;  // time limit for a later instance to send its message
constexpr char kTaken = 1;

bool IsOwnFolder(const std::string& path) {
  struct stat facts = {};
  return lstat(path.c_str(), &facts) == 0 && S_ISDIR(facts.st_mode) && facts.st_uid == geteuid() &&
         (facts.st_mode & 077) == 0;
}

// Empty if the system has no such folder.
std::string RuntimeFolder() {
  const char* const given = std::getenv("XDG_RUNTIME_DIR");
  if (given != nullptr && *given == '/' && IsOwnFolder(given)) return given;
  const std::string made = "/tmp/fotomill-" + std::to_string(geteuid());
  (void)mkdir(made.c_str(), 0700);
  return IsOwnFolder(made) ? made : std::string();
}

std::optional<sockaddr_un> AddressOf(const std::string& path) {
  sockaddr_un address = {};
  address.sun_family = AF_UNIX;
  if (path.size() >= sizeof(address.sun_path)) return std::nullopt;
  std::memcpy(address.sun_path, path.c_str(), path.size() + 1);
  return address;
}

Handle MakeSocket() {
  return Handle(socket(AF_UNIX, SOCK_STREAM | SOCK_CLOEXEC | SOCK_NONBLOCK, 0));
}

// Waits until the handle is ready or time is up.
bool WaitFor(int handle, short events, double until) {
  for (;;) {
    const double left = until - MonotonicSeconds();
    if (left <= 0) return false;
    pollfd wanted = {handle, events, 0};
    const int ready = poll(&wanted, 1, static_cast<int>(std::ceil(left * 1000)));
    if (ready > 0) return true;
    if (ready < 0 && errno != EINTR) return false;
  }
}

bool Send(int socket, const std::string& message, double until) {
  for (size_t sent = 0; sent < message.size();) {
    if (!WaitFor(socket, POLLOUT, until)) return false;
    const ssize_t count = send(socket, message.data() + sent, message.size() - sent, MSG_NOSIGNAL);
    if (count < 0 && errno != EAGAIN && errno != EINTR) return false;
    if (count > 0) sent += static_cast<size_t>(count);
  }
  return shutdown(socket, SHUT_WR) == 0;
}

// Reads to the end of the message; nullopt if it is too long or too late.
std::optional<std::string> Receive(int socket) {
  std::string message;
  char part[4096];
  const double until = MonotonicSeconds() + kSendSeconds;
  while (message.size() <= kMostMessage && WaitFor(socket, POLLIN, until)) {
    const ssize_t count = recv(socket, part, sizeof part, 0);
    if (count == 0) return message;
    if (count < 0 && errno != EAGAIN && errno != EINTR) break;
    if (count > 0) message.append(part, static_cast<size_t>(count));
  }
  return std::nullopt;
}

class Caller : public LaterStart {
 public:
  Caller(Handle socket, std::string message)
      : socket_(std::move(socket)), message_(std::move(message)) {}
  const std::string& Message() const override { return message_; }
  bool Accept() override {
    // A later instance that has given up has closed its end.
    pollfd state = {socket_.Number(), POLLOUT, 0};
    if (poll(&state, 1, 0) != 1 || (state.revents & (POLLHUP | POLLERR)) != 0) return false;
    return send(socket_.Number(), &kTaken, 1, MSG_NOSIGNAL) == 1;
  }

 private:
  Handle socket_;
  std::string message_;
};

}  // namespace

struct FirstStart::Place {
  std::string lockPath, socketPath;
  Handle lock, socket;
  Handle stop, stopped;  // pipe; closing it ends the listening thread

  // False if another instance holds it.
  bool Lock() {
    Handle file(OpenHandle(lockPath.c_str(), O_RDWR | O_CREAT | O_NOFOLLOW, 0600));
    if (!file.IsOpen() || flock(file.Number(), LOCK_EX | LOCK_NB) != 0) return false;
    // The previous instance may have deleted it between open and lock.
    struct stat mine = {}, there = {};
    if (fstat(file.Number(), &mine) != 0 || stat(lockPath.c_str(), &there) != 0 ||
        mine.st_ino != there.st_ino)
      return false;
    lock = std::move(file);
    return true;
  }

  bool Open() {
    const auto address = AddressOf(socketPath);
    int ends[2];
    if (!address || pipe2(ends, O_CLOEXEC) != 0) return false;
    stop.Reset(ends[1]);
    stopped.Reset(ends[0]);
    socket = MakeSocket();
    (void)unlink(socketPath.c_str());
    return socket.IsOpen() &&
           bind(socket.Number(), reinterpret_cast<const sockaddr*>(&*address), sizeof *address) ==
               0 &&
           listen(socket.Number(), SOMAXCONN) == 0;
  }

  bool HandOver(const std::string& message, double until) const {
    const auto address = AddressOf(socketPath);
    const Handle line = MakeSocket();
    char answer = 0;
    return address && line.IsOpen() &&
           connect(line.Number(), reinterpret_cast<const sockaddr*>(&*address), sizeof *address) ==
               0 &&
           Send(line.Number(), message, until) && WaitFor(line.Number(), POLLIN, until) &&
           recv(line.Number(), &answer, 1, 0) == 1 && answer == kTaken;
  }

  ~Place() {
    if (!lock.IsOpen()) return;
    if (socket.IsOpen()) (void)unlink(socketPath.c_str());
    (void)unlink(lockPath.c_str());
  }
};

FirstStart::FirstStart() = default;

FirstStart::~FirstStart() {
  if (place_ == nullptr) return;
  place_->stop.Reset();
  if (listener_.joinable()) listener_.join();
}

FirstStart::Standing FirstStart::Begin(const std::string& name, const std::string& message,
                                       double seconds) {
  const std::string folder = RuntimeFolder();
  if (folder.empty() || message.size() > kMostMessage) return Standing::Alone;
  auto place = std::make_unique<Place>();
  place->lockPath = folder + "/fotomill-" + name + ".lock";
  place->socketPath = folder + "/fotomill-" + name;
  const double until = MonotonicSeconds() + seconds;
  do {
    if (place->Lock()) {
      if (!place->Open()) return Standing::Alone;
      place_ = std::move(place);
      return Standing::First;
    }
    if (place->HandOver(message, until)) return Standing::HandedOver;
    std::this_thread::sleep_for(std::chrono::milliseconds(kPollMs));
  } while (MonotonicSeconds() < until);
  return Standing::Alone;
}

void FirstStart::Listen(std::function<void(std::shared_ptr<LaterStart> start)> came) {
  if (place_ == nullptr || listener_.joinable()) return;
  const auto listenOn = [place = place_.get(), came = std::move(came)] {
    for (;;) {
      pollfd wanted[] = {{place->socket.Number(), POLLIN, 0}, {place->stopped.Number(), 0, 0}};
      if (poll(wanted, 2, -1) < 0 && errno != EINTR) return;
      if (wanted[1].revents != 0) return;
      Handle line(accept4(place->socket.Number(), nullptr, nullptr, SOCK_CLOEXEC | SOCK_NONBLOCK));
      if (!line.IsOpen()) continue;
      if (auto message = Receive(line.Number()))
        came(std::make_shared<Caller>(std::move(line), std::move(*message)));
    }
  };
  try {
    listener_ = std::thread(listenOn);
  } catch (const std::system_error&) {  // no thread available: later instances run on their own
  }
}

}  // namespace fotomill::platform
