#include "platform/posix/exchange.h"

#include <fcntl.h>
#include <unistd.h>

#include <cerrno>
#include <cstdio>

#include "platform/posix/handle.h"

namespace fotomill::platform {

std::atomic<ReplaceWay> replaceWay{ReplaceWay::Exchange};
std::atomic<void (*)(const std::string& path)> beforeReplacing{nullptr};

namespace {

bool Exchange(const std::string& a, const std::string& b) {
  return renameat2(AT_FDCWD, a.c_str(), AT_FDCWD, b.c_str(), RENAME_EXCHANGE) == 0;
}

bool IsNotKnown(int error) {
  return error == EINVAL || error == ENOSYS || error == EOPNOTSUPP || error == EPERM;
}

// Undoes an exchange that found a different file than expected. If the new file was replaced in the
// meantime, that newer one stays.
CommitResult PutBack(const std::string& temporary, const std::string& path, const FileStamp& fresh,
                     bool& keep) {
  keep = !Exchange(temporary, path);
  if (keep) return CommitResult::Failed;
  if (StampOf(temporary) == fresh) return CommitResult::Taken;
  keep = !Exchange(temporary, path);
  return keep ? CommitResult::Failed : CommitResult::Taken;
}

CommitResult ReplaceByExchange(const std::string& temporary, const std::string& path,
                               const FileStamp& expected, bool& keep) {
  const FileStamp fresh = StampOf(temporary);
  if (!Exchange(temporary, path)) return CommitResult::Failed;
  if (!(StampOf(temporary) == expected)) return PutBack(temporary, path, fresh, keep);
  unlink(temporary.c_str());
  return CommitResult::Done;
}

// Keeps a hard link to the old file while the new one replaces it. False if the file system has no
// hard links.
bool ReplaceByLink(const std::string& temporary, const std::string& path, const FileStamp& expected,
                   CommitResult& result) {
  const std::string aside = temporary + "~";
  if (linkat(AT_FDCWD, path.c_str(), AT_FDCWD, aside.c_str(), 0) != 0) return false;
  result = CommitResult::Taken;
  if (StampOf(aside) == expected) {
    const bool done = std::rename(temporary.c_str(), path.c_str()) == 0;
    result = done ? CommitResult::Done : CommitResult::Failed;
    if (done && !(StampOf(aside) == expected) && std::rename(aside.c_str(), path.c_str()) == 0) {
      result = CommitResult::Taken;
      return true;
    }
  }
  unlink(aside.c_str());
  return true;
}

}  // namespace

CommitResult ReplaceExpected(const std::string& temporary, const std::string& path,
                             const FileStamp& expected, bool& keep) {
  keep = false;
  if (!(StampOf(path) == expected)) return CommitResult::Taken;
  if (auto* const hook = beforeReplacing.load()) hook(path);
  if (!expected.there && !expected.link) return RenameRefusing(temporary, path);
  const ReplaceWay first = replaceWay;
  if (first == ReplaceWay::Exchange) {
    const CommitResult result = ReplaceByExchange(temporary, path, expected, keep);
    if (result != CommitResult::Failed || keep || !IsNotKnown(errno)) return result;
  }
  CommitResult result = CommitResult::Failed;
  if (first != ReplaceWay::Look && ReplaceByLink(temporary, path, expected, result)) return result;
  if (!(StampOf(path) == expected)) return CommitResult::Taken;
  return std::rename(temporary.c_str(), path.c_str()) == 0 ? CommitResult::Done
                                                           : CommitResult::Failed;
}

}  // namespace fotomill::platform
