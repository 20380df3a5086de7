#include "platform/output_file.h"

#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

#include <atomic>
#include <cerrno>
#include <cstdio>

#include "platform/fault.h"
#include "platform/paths.h"

#ifndef RENAME_NOREPLACE
#define RENAME_NOREPLACE 1
#endif

namespace fotomill::platform {

namespace {

// ".fmw-PID-N.tmp" beside the destination: hidden, short, and unique within this machine and process.
std::string TemporarySibling(const std::string& path) {
  static std::atomic<unsigned> counter{0};
  char name[64];
  std::snprintf(name, sizeof name, ".fmw-%ld-%u.tmp", static_cast<long>(getpid()), ++counter);
  const PathParts parts = SplitPath(path);
  return JoinFolder(parts.folder, name);
}

bool WriteAll(int handle, const uint8_t* data, size_t size, int64_t offset) {
  while (size > 0) {
    const ssize_t count = offset < 0 ? write(handle, data, size) : pwrite(handle, data, size, offset);
    if (count < 0 && errno == EINTR) continue;
    if (count <= 0) return false;
    data += count;
    size -= static_cast<size_t>(count);
    if (offset >= 0) offset += count;
  }
  return true;
}

void SyncFolderOf(const std::string& path) {
  const std::string folder(SplitPath(path).folder);
  const int handle = open(folder.empty() ? "." : folder.c_str(), O_RDONLY | O_DIRECTORY | O_CLOEXEC);
  if (handle < 0) return;
  fsync(handle);
  close(handle);
}

}  // namespace

bool OutputFile::Create(const std::string& path) {
  Discard();
  struct stat facts;
  if (lstat(path.c_str(), &facts) == 0 && !S_ISREG(facts.st_mode) && !S_ISLNK(facts.st_mode)) return false;
  if (path.empty() || FileNameOf(path).empty() || FaultDue()) return false;
  for (int attempt = 0; attempt < 100 && handle_ < 0; ++attempt) {
    temporary_ = TemporarySibling(path);
    handle_ = open(temporary_.c_str(), O_RDWR | O_CREAT | O_EXCL | O_CLOEXEC, 0666);
    if (handle_ < 0 && errno != EEXIST) return false;
  }
  path_ = path;
  failed_ = false;
  return handle_ >= 0;
}

bool OutputFile::Write(std::span<const uint8_t> bytes) {
  if (failed_ || handle_ < 0) return false;
  if (FaultDue() || !WriteAll(handle_, bytes.data(), bytes.size(), -1)) failed_ = true;
  return !failed_;
}

bool OutputFile::WriteAt(uint64_t offset, std::span<const uint8_t> bytes) {
  if (failed_ || handle_ < 0) return false;
  if (FaultDue() || !WriteAll(handle_, bytes.data(), bytes.size(), static_cast<int64_t>(offset))) failed_ = true;
  return !failed_;
}

CommitResult OutputFile::Commit(Existing existing, bool sync) {
  if (handle_ < 0) return CommitResult::Failed;
  const bool replaces = existing == Existing::Replace && access(path_.c_str(), F_OK) == 0;
  if (replaces || sync) failed_ = failed_ || FaultDue() || fsync(handle_) != 0;
  failed_ = close(handle_) != 0 || failed_;
  handle_ = -1;
  if (failed_ || FaultDue()) {
    Discard();
    return CommitResult::Failed;
  }
  int result;
  if (existing == Existing::Replace) {
    result = rename(temporary_.c_str(), path_.c_str());
  } else {
    result = renameat2(AT_FDCWD, temporary_.c_str(), AT_FDCWD, path_.c_str(), RENAME_NOREPLACE);
    if (result != 0 && (errno == EINVAL || errno == ENOSYS)) {  // file systems without it: a hard link refuses as well
      result = link(temporary_.c_str(), path_.c_str());
      if (result == 0) unlink(temporary_.c_str());
    }
  }
  if (result != 0) {
    const bool taken = errno == EEXIST;
    Discard();
    return taken ? CommitResult::Taken : CommitResult::Failed;
  }
  temporary_.clear();
  if (replaces || sync) SyncFolderOf(path_);
  return CommitResult::Done;
}

void OutputFile::Discard() {
  if (handle_ >= 0) close(handle_);
  handle_ = -1;
  if (!temporary_.empty()) unlink(temporary_.c_str());
  temporary_.clear();
}

}  // namespace fotomill::platform
