#include "platform/temporary_file.h"

#include <fcntl.h>
#include <unistd.h>

#include <atomic>
#include <cerrno>
#include <cstdio>

#include "platform/fault.h"
#include "platform/file_view.h"
#include "platform/files.h"
#include "platform/folders.h"
#include "platform/paths.h"
#include "platform/posix/handle.h"
#include "platform/posix/kept_reason.h"
#include "platform/posix/stale_files.h"
#include "platform/posix/temporary_names.h"
#include "platform/reason.h"

namespace fotomill::platform {

namespace {

constexpr size_t kLongestPath = 260;
constexpr int kAttempts = 100;

bool CreateExclusively(const std::string& path) {
  if (FaultDue()) {
    errno = EIO;
    return false;
  }
  return OpenHandle(path.c_str(), O_RDWR | O_CREAT | O_EXCL | O_NOFOLLOW, 0600).IsOpen();
}

// A name that is most likely free; creating the file decides.
std::string RandomName(std::string_view extension) {
  static std::atomic<uint32_t> counter{0};
  uint32_t number = ++counter;
  if (getentropy(&number, sizeof number) != 0) errno = 0;  // the counter alone has to do
  char digits[16];
  std::snprintf(digits, sizeof digits, "-%08x", number);
  return ("FMWT" + OwnerOfTemporary()).append(digits).append(extension);
}

}  // namespace

bool TemporaryFile::Create(std::string_view extension) {
  Delete();
  if (extension.find('/') != std::string_view::npos ||
      extension.find('\0') != std::string_view::npos)
    return false;
  const std::string folder = SpecialFolderPath(SpecialFolder::Temporary);
  DeleteStaleFiles(folder);
  ForgetReason();
  for (int attempt = 0; attempt < kAttempts && path_.empty(); ++attempt) {
    std::string path = JoinFolder(folder, RandomName(extension.empty() ? ".tmp" : extension));
    if (path.size() > kLongestPath) break;
    if (CreateExclusively(path)) {
      path_ = std::move(path);
    } else if (errno != EEXIST) {
      KeepErrno();
      break;
    }
  }
  if (path_.empty()) {
    std::string path =
        AbsolutePath(std::string("TEMP$$$").append(extension.empty() ? ".$$$" : extension));
    if (!CreateExclusively(path)) return false;
    path_ = std::move(path);
  }
  listed_ = EnterTemporaryName(path_);
  return true;
}

bool TemporaryFile::Keep(const std::string& path, const std::string& folder) {
  Delete();
  if (!IsRegularFile(path) || !MakeFolders(folder)) return false;
  bool linked = false;
  for (int attempt = 0; attempt < kAttempts; ++attempt) {
    std::string name = JoinFolder(folder, RandomName(".old"));
    if (FaultDue()) return false;
    linked = linkat(AT_FDCWD, path.c_str(), AT_FDCWD, name.c_str(), AT_SYMLINK_FOLLOW) == 0;
    if (!linked) {
      if (errno == EEXIST) continue;
      if (!CreateExclusively(name)) return false;
    }
    path_ = std::move(name);
    listed_ = EnterTemporaryName(path_);
    break;
  }
  if (path_.empty() || linked) return linked;
  FileView view;
  if (view.Open(path) && Write(view.Bytes()) && view.Intact() && CopyTimes(path, path_))
    return true;
  Delete();
  return false;
}

bool TemporaryFile::Write(std::span<const uint8_t> bytes) {
  if (path_.empty() || FaultDue()) return false;
  struct stat facts;
  Handle handle = OpenRegular(path_.c_str(), O_WRONLY | O_NOFOLLOW, facts);
  if (!handle.IsOpen() || FaultDue() || ftruncate(handle.Number(), 0) != 0) return false;
  const bool written = WriteFully(handle.Number(), bytes.data(), bytes.size());
  return handle.Reset() && written;
}

void TemporaryFile::Delete() {
  LeaveTemporaryName(listed_);
  listed_ = -1;
  if (!path_.empty()) unlink(path_.c_str());
  path_.clear();
}

}  // namespace fotomill::platform
