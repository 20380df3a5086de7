#include "platform/store_file.h"

#include <fcntl.h>
#include <sys/file.h>
#include <sys/stat.h>
#include <sys/uio.h>
#include <unistd.h>

#include <algorithm>
#include <cerrno>
#include <chrono>
#include <thread>
#include <utility>

#include "platform/fault.h"
#include "platform/lock_wait.h"
#include "platform/posix/handle.h"
#include "platform/posix/kept_reason.h"
#include "platform/posix/lock_holder.h"
#include "platform/process.h"
#include "platform/reason.h"

namespace fotomill::platform {

std::function<void(const std::string& path, const std::string& holder)> onLongLockWait;

namespace {

constexpr std::chrono::microseconds kFirstPause{100};
constexpr std::chrono::microseconds kLongestPause{10'000};
constexpr std::chrono::seconds kSilentWait{2};   // before the lock's holder is reported
constexpr std::chrono::seconds kLongestWait{10};
// offset beyond any file's end, for the "in use" lock
constexpr off_t kUseMark = off_t{1} << 62;

// Whether an open failed because the name does not exist. A dangling link does exist. A
// file created since then is not considered, as concurrent creation and deletion would
// cause spurious errors.
bool IsNoName(const std::string& path, int error) {
  struct stat facts;
  return (error == ENOENT || error == ENOTDIR) &&
         (lstat(path.c_str(), &facts) != 0 || !S_ISLNK(facts.st_mode));
}

int64_t Nanoseconds(const struct stat& facts) {
  return int64_t{facts.st_mtim.tv_sec} * 1'000'000'000 + facts.st_mtim.tv_nsec;
}

bool InRange(uint64_t offset, size_t size) {
  return offset <= INT64_MAX && size <= INT64_MAX - offset;
}

}  // namespace

StoreFile::StoreFile(StoreFile&& other) noexcept
    : handle_(std::exchange(other.handle_, -1)),
      device_(other.device_),
      identity_(other.identity_) {}

StoreFile& StoreFile::operator=(StoreFile&& other) noexcept {
  if (this != &other) {
    Close();
    handle_ = std::exchange(other.handle_, -1);
    device_ = other.device_;
    identity_ = other.identity_;
  }
  return *this;
}

StoreFile::OpenResult StoreFile::Open(const std::string& path, Mode mode) {
  Close();
  ForgetReason();
  if (FaultDue()) return OpenResult::Failed;
  Handle handle;
  struct stat facts;
  if (mode == Mode::CreateNew) {
    handle = OpenHandle(path.c_str(), O_RDWR | O_CREAT | O_EXCL | O_NOFOLLOW, 0666);
    if (!handle.IsOpen()) {
      KeepErrno();
      return errno == EEXIST ? OpenResult::Exists : OpenResult::Failed;
    }
    if (fstat(handle.Number(), &facts) != 0) return OpenResult::Failed;
  } else {
    handle = OpenRegular(path.c_str(), mode == Mode::Read ? O_RDONLY : O_RDWR | O_NOFOLLOW, facts);
    if (!handle.IsOpen()) return IsNoName(path, errno) ? OpenResult::Missing : OpenResult::Failed;
  }
  device_ = facts.st_dev;
  identity_ = facts.st_ino;
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
  return fstat(static_cast<int>(handle_), &facts) == 0 ? Nanoseconds(facts) : 0;
}

bool StoreFile::ReadAt(uint64_t offset, std::span<uint8_t> bytes) const {
  if (!IsOpen() || !InRange(offset, bytes.size()) || FaultDue()) return false;
  return ReadFully(static_cast<int>(handle_), bytes.data(), bytes.size(),
                   static_cast<int64_t>(offset)) == static_cast<int64_t>(bytes.size());
}

bool StoreFile::WriteAt(uint64_t offset, std::span<const uint8_t> bytes) {
  if (!IsOpen() || !InRange(offset, bytes.size()) || FaultDue()) return false;
  return WriteFully(static_cast<int>(handle_), bytes.data(), bytes.size(),
                    static_cast<int64_t>(offset));
}

bool StoreFile::ReadAt(uint64_t offset, std::span<uint8_t> first, std::span<uint8_t> second) const {
  const size_t size = first.size() + second.size();
  if (!IsOpen() || !InRange(offset, size) || FaultDue()) return false;
  const iovec parts[] = {{first.data(), first.size()}, {second.data(), second.size()}};
  if (preadv(static_cast<int>(handle_), parts, 2, static_cast<off_t>(offset)) ==
      static_cast<ssize_t>(size))
    return true;
  // short read: interrupted, or at the end of the file
  return ReadAt(offset, first) && ReadAt(offset + first.size(), second);
}

bool StoreFile::WriteAt(uint64_t offset, std::span<const uint8_t> first,
                        std::span<const uint8_t> second) {
  const size_t size = first.size() + second.size();
  if (!IsOpen() || !InRange(offset, size) || FaultDue()) return false;
  const iovec parts[] = {{const_cast<uint8_t*>(first.data()), first.size()},
                         {const_cast<uint8_t*>(second.data()), second.size()}};
  if (pwritev(static_cast<int>(handle_), parts, 2, static_cast<off_t>(offset)) ==
      static_cast<ssize_t>(size))
    return true;
  // short write: interrupted, or the disk is full
  return WriteAt(offset, first) && WriteAt(offset + first.size(), second);
}

bool StoreFile::Sync() { return IsOpen() && !FaultDue() && SyncHandle(static_cast<int>(handle_)); }

// Polls instead of blocking in the kernel, so that Ctrl-C works.
bool StoreFile::Lock() {
  ForgetReason();
  if (!IsOpen() || FaultDue()) return false;
  std::chrono::microseconds pause = kFirstPause;
  const auto begin = std::chrono::steady_clock::now();
  bool told = false;
  while (flock(static_cast<int>(handle_), LOCK_EX | LOCK_NB) != 0) {
    if (errno != EWOULDBLOCK && errno != EINTR) return false;
    if (PendingExit() != 0) return false;
    const auto waited = std::chrono::steady_clock::now() - begin;
    if (waited > kLongestWait) {
      KeepReason("It is locked by " + LockHolder(static_cast<int>(handle_)));
      return false;
    }
    if (waited > kSilentWait && !told) {
      told = true;
      if (onLongLockWait)
        onLongLockWait(PathOfHandle(static_cast<int>(handle_)),
                       LockHolder(static_cast<int>(handle_)));
    }
    std::this_thread::sleep_for(pause);
    pause = std::min(pause * 2, kLongestPause);
  }
  return true;
}

void StoreFile::Unlock() {
  if (IsOpen()) flock(static_cast<int>(handle_), LOCK_UN);
}

bool StoreFile::Resize(uint64_t size) {
  return IsOpen() && size <= INT64_MAX && !FaultDue() &&
         ftruncate(static_cast<int>(handle_), static_cast<off_t>(size)) == 0;
}

// A byte-range lock, independent of the lock on the whole file; it ends with the open file, too.
bool StoreFile::MarkInUse() {
  struct flock range = {};
  range.l_type = F_RDLCK;
  range.l_start = kUseMark;
  range.l_len = 1;
  return IsOpen() && fcntl(static_cast<int>(handle_), F_OFD_SETLK, &range) == 0;
}

bool StoreFile::InUseByOthers() const {
  struct flock range = {};
  range.l_type = F_WRLCK;
  range.l_start = kUseMark;
  range.l_len = 1;
  return IsOpen() && fcntl(static_cast<int>(handle_), F_OFD_GETLK, &range) == 0 &&
         range.l_type != F_UNLCK;
}

bool StoreFile::IsStill(const std::string& path) const {
  uint64_t size;
  int64_t modified;
  return IsStill(path, size, modified);
}

bool StoreFile::IsStill(const std::string& path, uint64_t& size, int64_t& modified) const {
  struct stat named;
  if (!IsOpen() || stat(path.c_str(), &named) != 0 || named.st_dev != device_ ||
      named.st_ino != identity_)
    return false;
  size = static_cast<uint64_t>(named.st_size);
  modified = Nanoseconds(named);
  return true;
}

}  // namespace fotomill::platform
