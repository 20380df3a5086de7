#include "platform/posix/handle.h"

#include <fcntl.h>
#include <unistd.h>

#include <algorithm>
#include <cerrno>
#include <cstdio>

#include "platform/paths.h"
#include "platform/posix/kept_reason.h"

namespace fotomill::platform {

std::atomic<RefusingRename> refusingRename{RefusingRename::Directly};

namespace {

// per read or write call; the kernel transfers at most 2 GiB
constexpr uint64_t kMostAtOnce = uint64_t{1} << 30;

// Whether both names refer to one directory entry, such as "a.jpg" and "A.JPG" on a
// case-insensitive file system.
bool OneEntry(const std::string& from, const std::string& to) {
  struct stat first, second;
  return lstat(from.c_str(), &first) == 0 && lstat(to.c_str(), &second) == 0 &&
         first.st_dev == second.st_dev && first.st_ino == second.st_ino && first.st_nlink == 1 &&
         from != to;
}

// The next two functions are for files only: folders cannot be hard-linked or reserved
// by a placeholder.
CommitResult RenameByLink(const std::string& from, const std::string& to) {
  if (linkat(AT_FDCWD, from.c_str(), AT_FDCWD, to.c_str(), 0) != 0) {
    return errno == EEXIST ? CommitResult::Taken : CommitResult::Failed;
  }
  if (unlink(from.c_str()) == 0) return CommitResult::Done;
  unlink(to.c_str());
  return CommitResult::Failed;
}

CommitResult RenameOverPlaceholder(const std::string& from, const std::string& to) {
  struct stat facts;
  if (lstat(from.c_str(), &facts) != 0 || S_ISDIR(facts.st_mode)) return CommitResult::Failed;
  if (!OpenHandle(to.c_str(), O_WRONLY | O_CREAT | O_EXCL, 0600).IsOpen()) {
    return errno == EEXIST ? CommitResult::Taken : CommitResult::Failed;
  }
  if (std::rename(from.c_str(), to.c_str()) == 0) return CommitResult::Done;
  unlink(to.c_str());
  return CommitResult::Failed;
}

}  // namespace

bool Handle::Reset(int number) {
  const int old = number_;
  number_ = number;
  // after EINTR the descriptor is closed anyway
  return old < 0 || close(old) == 0 || errno == EINTR;
}

Handle OpenHandle(const char* path, int flags, mode_t mode) {
  int number;
  do {
    number = open(path, flags | O_CLOEXEC, mode);
  } while (number < 0 && errno == EINTR);
  return Handle(number);
}

Handle OpenRegular(const char* path, int flags, struct stat& facts) {
  Handle handle = OpenHandle(path, flags | O_NONBLOCK | O_NOCTTY);
  if (!handle.IsOpen() || fstat(handle.Number(), &facts) != 0) {
    KeepErrno();
    return Handle();
  }
  if (S_ISREG(facts.st_mode)) return handle;
  handle.Reset();
  errno = S_ISDIR(facts.st_mode) ? EISDIR : EINVAL;
  KeepErrno();
  return Handle();
}

int64_t ReadFully(int handle, uint8_t* data, uint64_t size, int64_t offset) {
  uint64_t done = 0;
  while (done < size) {
    const size_t part = static_cast<size_t>(std::min(size - done, kMostAtOnce));
    const ssize_t count =
        offset < 0 ? read(handle, data + done, part)
                   : pread(handle, data + done, part, offset + static_cast<int64_t>(done));
    if (count < 0 && errno == EINTR) continue;
    if (count < 0) return -1;
    if (count == 0) break;
    done += static_cast<uint64_t>(count);
  }
  return static_cast<int64_t>(done);
}

bool WriteFully(int handle, const uint8_t* data, uint64_t size, int64_t offset) {
  uint64_t done = 0;
  while (done < size) {
    const size_t part = static_cast<size_t>(std::min(size - done, kMostAtOnce));
    const ssize_t count =
        offset < 0 ? write(handle, data + done, part)
                   : pwrite(handle, data + done, part, offset + static_cast<int64_t>(done));
    if (count < 0 && errno == EINTR) continue;
    if (count <= 0) return false;
    done += static_cast<uint64_t>(count);
  }
  return true;
}

bool SyncHandle(int handle) {
  int result;
  do {
    result = fsync(handle);
  } while (result != 0 && errno == EINTR);
  return result == 0;
}

std::string OpenableFolderOf(const std::string& path) {
  const std::string folder = FolderOf(path);
  return folder.empty() ? "." : folder;
}

void SyncFolderOf(const std::string& path) {
  const Handle handle = OpenHandle(OpenableFolderOf(path).c_str(), O_RDONLY | O_DIRECTORY);
  if (handle.IsOpen()) SyncHandle(handle.Number());
}

CommitResult RenameRefusing(const std::string& from, const std::string& to) {
  const RefusingRename first = refusingRename;
  errno = ENOSYS;
  if (first == RefusingRename::Directly) {
    if (renameat2(AT_FDCWD, from.c_str(), AT_FDCWD, to.c_str(), RENAME_NOREPLACE) == 0)
      return CommitResult::Done;
    if (errno == EEXIST && OneEntry(from, to)) {
      return std::rename(from.c_str(), to.c_str()) == 0 ? CommitResult::Done : CommitResult::Failed;
    }
    if (errno == EEXIST) return CommitResult::Taken;
    if (errno != EINVAL && errno != ENOSYS && errno != EOPNOTSUPP) return CommitResult::Failed;
  }
  if (first != RefusingRename::ByPlaceholder) {
    const CommitResult result = RenameByLink(from, to);
    if (result != CommitResult::Failed ||
        (errno != EPERM && errno != EOPNOTSUPP && errno != ENOSYS))
      return result;
  }
  return RenameOverPlaceholder(from, to);
}

}  // namespace fotomill::platform
