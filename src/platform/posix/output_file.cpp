#include "platform/output_file.h"

#include <fcntl.h>
#include <sys/file.h>
#include <sys/sendfile.h>
#include <sys/stat.h>
#include <unistd.h>

#include <algorithm>
#include <atomic>
#include <cerrno>
#include <cstdio>
#include <string_view>
#include <utility>

#include "platform/fault.h"
#include "platform/files.h"
#include "platform/paths.h"
#include "platform/posix/attributes.h"
#include "platform/posix/exchange.h"
#include "platform/posix/handle.h"
#include "platform/posix/kept_reason.h"
#include "platform/posix/stale_files.h"
#include "platform/posix/temporary_names.h"
#include "platform/reason.h"

namespace fotomill::platform {

std::atomic<UnnamedFiles> unnamedFiles{UnnamedFiles::Work};

namespace {

constexpr int kAttempts = 100;
constexpr size_t kCopyStep = size_t{1} << 30;

// ".fmw-OWNER-N.tmp" in the destination's folder: hidden, short, and unique within this
// machine and process.
std::string TemporarySibling(const std::string& path) {
  static std::atomic<unsigned> counter{0};
  char name[64];
  std::snprintf(name, sizeof name, ".fmw-%s-%x.tmp", OwnerOfTemporary().c_str(), ++counter);
  return JoinFolder(SplitPath(path).folder, name);
}

// A path that refers to an open file, even an unnamed one.
std::string HandlePath(int handle) { return "/proc/self/fd/" + std::to_string(handle); }

Handle OpenUnnamed(const std::string& folder, mode_t mode) {
  static const bool canBeNamed = access("/proc/self/fd", X_OK) == 0;
  if (!canBeNamed || unnamedFiles == UnnamedFiles::DoNotWork) return Handle();
  return OpenHandle(folder.c_str(), O_TMPFILE | O_RDWR, mode);
}

// Gives an unnamed file a name; false with errno.
bool NameUnnamed(int handle, const std::string& path) {
  if (unnamedFiles == UnnamedFiles::GetNoName) {
    errno = EPERM;
    return false;
  }
  return linkat(AT_FDCWD, HandlePath(handle).c_str(), AT_FDCWD, path.c_str(), AT_SYMLINK_FOLLOW) ==
         0;
}

// Reports errors that the kernel delays until close(), without closing the file.
bool CloseCopyOf(int handle) {
  Handle copy(fcntl(handle, F_DUPFD_CLOEXEC, 0));
  return copy.IsOpen() && copy.Reset();
}

// Whether a link may be replaced: one to a regular file, or a dangling one. Others belong to the
// system or stand for a location, as do links to an open file such as /dev/stdout.
bool MayReplaceLink(const std::string& path) {
  constexpr std::string_view kOpenFiles = "/proc/";
  char target[kOpenFiles.size()];
  const ssize_t count = readlink(path.c_str(), target, sizeof target);
  struct stat facts;
  const bool replaceable = count >= 0 &&
                           std::string_view(target, static_cast<size_t>(count)) != kOpenFiles &&
                           (stat(path.c_str(), &facts) != 0 || S_ISREG(facts.st_mode));
  if (!replaceable) errno = EINVAL;
  return replaceable;
}

// Whether `path` may be written: it does not exist, is a link that may be replaced, or is a
// writable regular file, whose permissions are returned in `mode`. False with errno.
bool MayBecome(const std::string& path, mode_t& mode) {
  struct stat facts;
  if (lstat(path.c_str(), &facts) != 0) return errno == ENOENT;
  if (S_ISLNK(facts.st_mode)) return MayReplaceLink(path);
  if (!S_ISREG(facts.st_mode)) {
    errno = EINVAL;
    return false;
  }
  mode = facts.st_mode & 0777;
  return faccessat(AT_FDCWD, path.c_str(), W_OK, AT_EACCESS) == 0;
}

// The nearest existing ancestor of a path, even if it is not a folder.
std::string FolderThatExists(std::string path) {
  struct stat facts;
  do {
    const size_t end = path.find_last_not_of('/');
    const size_t slash = end == std::string::npos ? end : path.rfind('/', end);
    if (slash == std::string::npos) return path.starts_with('/') ? "/" : ".";
    path.resize(std::max<size_t>(slash, 1));
  } while (lstat(path.c_str(), &facts) != 0 && errno == ENOENT);
  return path;
}

CommitResult SayChanged(const std::string& path) {
  HeldFile::SetChanged(path);
  KeepReason("The file was changed by another program");
  return CommitResult::Failed;
}

}  // namespace

bool MayCreate(const std::string& path) {
  ForgetReason();
  mode_t mode = 0;
  const bool may =
      MayBecome(path, mode) &&
      faccessat(AT_FDCWD, (FolderThatExists(path) + "/").c_str(), W_OK | X_OK, AT_EACCESS) == 0;
  if (!may) KeepErrno();
  return may;
}

bool OutputFile::Create(const std::string& path) {
  Discard();
  ForgetReason();
  errno = 0;
  mode_t mode = 0666;
  if (path.empty() || FileNameOf(path).empty() || !MayBecome(path, mode) || FaultDue()) {
    KeepErrno();
    return false;
  }
  path_ = path;
  failed_ = false;
  handle_ = OpenUnnamed(OpenableFolderOf(path), mode).Release();
  if (handle_ < 0 && !CreateNamedSibling(mode)) {
    KeepErrno();
    return false;
  }
  flock(handle_, LOCK_EX | LOCK_NB);  // tells other instances that it is not stale
  return true;
}

bool OutputFile::CreateNamedSibling(unsigned mode) {
  DeleteStaleFiles(OpenableFolderOf(path_));
  for (int attempt = 0; attempt < kAttempts; ++attempt) {
    std::string name = TemporarySibling(path_);
    const int handle =
        OpenHandle(name.c_str(), O_RDWR | O_CREAT | O_EXCL | O_NOFOLLOW, mode).Release();
    if (handle < 0 && errno == EEXIST) continue;
    if (handle < 0) return false;
    if (handle_ >= 0) close(handle_);
    handle_ = handle;
    temporary_ = std::move(name);
    listed_ = EnterTemporaryName(temporary_);
    return true;
  }
  return false;
}

bool OutputFile::Write(std::span<const uint8_t> bytes) {
  if (failed_ || handle_ < 0) return false;
  failed_ = FaultDue() || !WriteFully(handle_, bytes.data(), bytes.size());
  if (failed_) KeepErrno();
  return !failed_;
}

bool OutputFile::WriteAt(uint64_t offset, std::span<const uint8_t> bytes) {
  if (failed_ || handle_ < 0) return false;
  failed_ = offset > INT64_MAX - bytes.size() || FaultDue() ||
            !WriteFully(handle_, bytes.data(), bytes.size(), static_cast<int64_t>(offset));
  if (failed_) KeepErrno();
  return !failed_;
}

CommitResult OutputFile::Commit(Existing existing, bool sync) {
  if (handle_ < 0) return CommitResult::Failed;
  if (!failed_) ForgetReason();
  KeepLostAttributes({});
  struct stat facts;
  const bool there = lstat(path_.c_str(), &facts) == 0;
  const bool replaces = existing == Existing::Replace && there;
  failed_ = failed_ || (replaces && !S_ISREG(facts.st_mode) &&
                        !(S_ISLNK(facts.st_mode) && MayReplaceLink(path_)));
  if (replaces && !failed_ && S_ISREG(facts.st_mode))
    KeepLostAttributes(CopyAttributes(path_, facts, handle_));
  bool synced = sync || replaces;
  if (synced && !failed_) {
    failed_ = FaultDue() || !SyncHandle(handle_);
    if (failed_) KeepErrno();
  }
  CommitResult result = CommitResult::Failed;
  if (!failed_ && CloseCopyOf(handle_) && !FaultDue()) {
    result = TakeName(existing, replaces, synced);
    if (result == CommitResult::Failed && SystemReason().empty()) KeepErrno();
  }
  if (result == CommitResult::Done) temporary_.clear();
  Discard();
  if (result == CommitResult::Done && synced) SyncFolderOf(path_);
  return result;
}

// Renames the temporary file to its name. `synced` is set if that required a sync.
CommitResult OutputFile::TakeName(Existing existing, bool replaces, bool& synced) {
  FileStamp expected;
  const bool held = existing == Existing::Replace && HeldFile::Find(path_, expected);
  if (held && !(StampOf(path_) == expected)) return SayChanged(path_);
  if (temporary_.empty() && !replaces) {
    if (NameUnnamed(handle_, path_)) return CommitResult::Done;
    if (errno == EEXIST && existing == Existing::Refuse) return CommitResult::Taken;
  }
  if (temporary_.empty() && !NameSibling()) return CommitResult::Failed;
  if (existing == Existing::Refuse) return RenameRefusing(temporary_, path_);
  if (!synced && FileExists(path_)) {
    synced = true;
    if (FaultDue() || !SyncHandle(handle_)) return CommitResult::Failed;
  }
  if (FaultDue()) return CommitResult::Failed;
  if (!held) {
    return std::rename(temporary_.c_str(), path_.c_str()) == 0 ? CommitResult::Done
                                                               : CommitResult::Failed;
  }
  LeaveTemporaryName(listed_);  // by now it may hold what another program has written
  listed_ = -1;
  bool keep = false;
  const CommitResult result = ReplaceExpected(temporary_, path_, expected, keep);
  if (keep) temporary_.clear();
  return result == CommitResult::Taken ? SayChanged(path_) : result;
}

// Gives an unnamed file a temporary name.
bool OutputFile::NameSibling() {
  if (FaultDue()) return false;
  DeleteStaleFiles(OpenableFolderOf(path_));
  for (int attempt = 0; attempt < kAttempts; ++attempt) {
    std::string name = TemporarySibling(path_);
    if (NameUnnamed(handle_, name)) {
      temporary_ = std::move(name);
      listed_ = EnterTemporaryName(temporary_);
      return true;
    }
    if (errno != EEXIST) break;
  }
  return CopySibling();
}

// The system created an unnamed file but cannot link it: copies the contents to a named one.
bool OutputFile::CopySibling() {
  struct stat facts;
  if (fstat(handle_, &facts) != 0) return false;
  const Handle source(fcntl(handle_, F_DUPFD_CLOEXEC, 0));
  if (!source.IsOpen() || !CreateNamedSibling(facts.st_mode & 0777)) return false;
  flock(handle_, LOCK_EX | LOCK_NB);
  struct stat old;
  if (lstat(path_.c_str(), &old) == 0 && S_ISREG(old.st_mode)) {
    KeepLostAttributes(CopyAttributes(path_, old, handle_));
  } else {
    fchmod(handle_, facts.st_mode & 0777);
  }
  off_t done = 0;
  while (done < facts.st_size) {
    const ssize_t count = sendfile(handle_, source.Number(), &done, kCopyStep);
    if (count < 0 && errno == EINTR) continue;
    if (count <= 0) return false;
  }
  return SyncHandle(handle_) && CloseCopyOf(handle_);
}

void OutputFile::Discard() {
  if (handle_ >= 0) close(handle_);
  handle_ = -1;
  LeaveTemporaryName(listed_);
  listed_ = -1;
  if (!temporary_.empty()) unlink(temporary_.c_str());
  temporary_.clear();
}

}  // namespace fotomill::platform
