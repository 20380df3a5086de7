#include "platform/store_file.h"

#include <fcntl.h>
#include <sys/file.h>
#include <sys/stat.h>
#include <unistd.h>

#include <algorithm>
#include <cerrno>
#include <chrono>
#include <thread>
#include <utility>

#include "platform/fault.h"
#include "platform/posix/handle.h"
#include "platform/process.h"

namespace fotomill::platform {

namespace {

constexpr std::chrono::microseconds kFirstPause{100};
constexpr std::chrono::microseconds kLongestPause{10'000};

// Whether an open failed because there is nothing of that name. A link that leads nowhere is something; a file that has
// come since then is not asked for, or who creates and removes files side by side would meet errors that are none.
bool IsNoName(const std::string& path, int error) {
  struct stat facts;
  return (error == ENOENT || error == ENOTDIR) && (lstat(path.c_str(), &facts) != 0 || !S_ISLNK(facts.st_mode));
}

bool InRange(uint64_t offset, size_t size) { return offset <= INT64_MAX && size <= INT64_MAX - offset; }

}  // namespace

StoreFile::StoreFile(StoreFile&& other) noexcept : handle_(std::exchange(other.handle_, -1)) {}

StoreFile& StoreFile::operator=(StoreFile&& other) noexcept {
  if (this != &other) {
    Close();
    handle_ = std::exchange(other.handle_, -1);
  }
  return *this;
}

StoreFile::OpenResult StoreFile::Open(const std::string& path, Mode mode) {
  Close();
  if (FaultDue()) return OpenResult::Failed;
  Handle handle;
  if (mode == Mode::CreateNew) {
    handle = OpenHandle(path.c_str(), O_RDWR | O_CREAT | O_EXCL | O_NOFOLLOW, 0666);
    if (!handle.IsOpen()) return errno == EEXIST ? OpenResult::Exists : OpenResult::Failed;
  } else {
    struct stat facts;
    handle = OpenRegular(path.c_str(), mode == Mode::Read ? O_RDONLY : O_RDWR | O_NOFOLLOW, facts);
    if (!handle.IsOpen()) return IsNoName(path, errno) ? OpenResult::Missing : OpenResult::Failed;
  }
  handle_ = handle.Release();
  return OpenResult::Done;
}

void StoreFile::Close() {
  if (IsOpen()) close(static_cast<int>(std::exchange(handle_, -1)));
}

uint64_t StoreFile::Size() const {
  struct stat facts;
  return fstat(static_cast<int>(handle_), &facts) == 0 ? static_cast<uint64_t>(facts.st_size) : 0;
}

int64_t StoreFile::Modified() const {
  struct stat facts;
  if (fstat(static_cast<int>(handle_), &facts) != 0) return 0;
  return int64_t{facts.st_mtim.tv_sec} * 1'000'000'000 + facts.st_mtim.tv_nsec;
}

bool StoreFile::ReadAt(uint64_t offset, std::span<uint8_t> bytes) const {
  if (!IsOpen() || !InRange(offset, bytes.size()) || FaultDue()) return false;
  return ReadFully(static_cast<int>(handle_), bytes.data(), bytes.size(), static_cast<int64_t>(offset)) ==
         static_cast<int64_t>(bytes.size());
}

bool StoreFile::WriteAt(uint64_t offset, std::span<const uint8_t> bytes) {
  if (!IsOpen() || !InRange(offset, bytes.size()) || FaultDue()) return false;
  return WriteFully(static_cast<int>(handle_), bytes.data(), bytes.size(), static_cast<int64_t>(offset));
}

bool StoreFile::Sync() { return IsOpen() && !FaultDue() && SyncHandle(static_cast<int>(handle_)); }

// Asks again and again instead of waiting inside the system, so that Ctrl-C is heard.
bool StoreFile::Lock() {
  if (!IsOpen() || FaultDue()) return false;
  std::chrono::microseconds pause = kFirstPause;
  while (flock(static_cast<int>(handle_), LOCK_EX | LOCK_NB) != 0) {
    if (errno != EWOULDBLOCK && errno != EINTR) return false;
    if (PendingExit() != 0) return false;
    std::this_thread::sleep_for(pause);
    pause = std::min(pause * 2, kLongestPause);
  }
  return true;
}

void StoreFile::Unlock() {
  if (IsOpen()) flock(static_cast<int>(handle_), LOCK_UN);
}

bool StoreFile::IsStill(const std::string& path) const {
  struct stat own, named;
  return IsOpen() && fstat(static_cast<int>(handle_), &own) == 0 && stat(path.c_str(), &named) == 0 &&
         own.st_dev == named.st_dev && own.st_ino == named.st_ino;
}

}  // namespace fotomill::platform
