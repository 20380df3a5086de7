#include "platform/posix/stale_files.h"

#include <dirent.h>
#include <fcntl.h>
#include <signal.h>
#include <sys/file.h>
#include <sys/stat.h>
#include <unistd.h>

#include <cerrno>
#include <cstdio>
#include <filesystem>
#include <memory>
#include <mutex>
#include <set>
#include <string_view>
#include <system_error>

#include "platform/paths.h"
#include "platform/posix/handle.h"

namespace fotomill::platform {

namespace {

// Process ids mean nothing in another PID namespace, such as a container that shares
// the temporary folder.
unsigned ProcessSpace() {
  struct stat facts;
  return stat("/proc/self/ns/pid", &facts) == 0 ? static_cast<unsigned>(facts.st_ino & 0xFFFF) : 0;
}

// Whether a temporary name belongs to a process that has ended:
// ".fmw-PID-SPACE-N.tmp", "FMWTPID-SPACE-N.EXT".
bool IsOfEndedProcess(const char* name) {
  unsigned process = 0, space = 0;
  char separator = 0;
  if (std::sscanf(name, ".fmw-%x-%x%c", &process, &space, &separator) != 3 &&
      std::sscanf(name, "FMWT%x-%x%c", &process, &space, &separator) != 3) {
    return false;
  }
  return separator == '-' && process > 0 && space == ProcessSpace() &&
         kill(static_cast<pid_t>(process), 0) != 0 && errno == ESRCH;
}

// Deletes one of this user's temporary folders with its contents. False if `path` is not one.
bool DeletedFolder(const std::string& path) {
  struct stat facts;
  if (lstat(path.c_str(), &facts) != 0 || !S_ISDIR(facts.st_mode) || facts.st_uid != geteuid())
    return false;
  std::error_code ignored;
  std::filesystem::remove_all(path, ignored);
  return true;
}

}  // namespace

std::string OwnerOfTemporary() {
  char owner[32];
  std::snprintf(owner, sizeof owner, "%x-%04x", static_cast<unsigned>(getpid()), ProcessSpace());
  return owner;
}

void DeleteStaleFiles(const std::string& folder) {
  static std::mutex mutex;
  static std::set<std::string> cleaned;
  {
    const std::lock_guard lock(mutex);
    if (!cleaned.insert(folder).second) return;
  }
  const std::unique_ptr<DIR, int (*)(DIR*)> entries(opendir(folder.empty() ? "." : folder.c_str()),
                                                    closedir);
  if (entries == nullptr) return;
  while (const dirent* entry = readdir(entries.get())) {
    const std::string_view name = entry->d_name;
    if ((!name.starts_with(".fmw-") && !name.starts_with("FMWT")) ||
        !IsOfEndedProcess(entry->d_name))
      continue;
    struct stat facts;
    const std::string path = JoinFolder(folder, name);
    if (name.starts_with("FMWT") && DeletedFolder(path)) continue;
    const Handle file = OpenRegular(path.c_str(), O_RDONLY | O_NOFOLLOW, facts);
    if (!file.IsOpen() || facts.st_uid != geteuid() || flock(file.Number(), LOCK_EX | LOCK_NB) != 0)
      continue;
    unlink(path.c_str());
  }
}

}  // namespace fotomill::platform
