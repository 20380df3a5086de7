#include "platform/posix/lock_holder.h"

#include <sys/stat.h>
#include <unistd.h>

#include <climits>
#include <cstdio>
#include <string_view>

#include "platform/files.h"

namespace fotomill::platform {

namespace {

constexpr const char* kUnknown = "another program";
constexpr uint64_t kMostText = 1 << 20;

// The first line of a small file in /proc; empty if it cannot be read.
std::string LineOf(const std::string& path) {
  std::string text;
  if (ReadWholeFile(path, kMostText, text) != ReadResult::Done) return {};
  return text.substr(0, text.find('\n'));
}

}  // namespace

// /proc/locks has lines such as "3: FLOCK  ADVISORY  WRITE 123 08:01:4567 0 EOF", with the inode
// after the device; some file systems report a different device there than in stat, so only the
// inode is compared.
std::string LockHolder(int handle) {
  struct stat facts;
  std::string text;
  if (fstat(handle, &facts) != 0 ||
      ReadWholeFile("/proc/locks", kMostText, text) != ReadResult::Done)
    return kUnknown;
  for (size_t at = 0; at < text.size();) {
    const size_t end = text.find('\n', at);
    const std::string line = text.substr(at, end - at);
    at = end == std::string::npos ? text.size() : end + 1;
    int process = 0;
    unsigned long long number = 0;
    if (std::sscanf(line.c_str(), "%*d: FLOCK %*s %*s %d %*x:%*x:%llu", &process, &number) != 2)
      continue;
    if (number != facts.st_ino || process <= 0) continue;
    const std::string name = LineOf("/proc/" + std::to_string(process) + "/comm");
    const std::string which = "process " + std::to_string(process);
    return name.empty() ? which : name + " (" + which + ")";
  }
  return kUnknown;
}

std::string PathOfHandle(int handle) {
  char path[PATH_MAX];
  const ssize_t count =
      readlink(("/proc/self/fd/" + std::to_string(handle)).c_str(), path, sizeof path);
  return count > 0 ? std::string(path, static_cast<size_t>(count)) : std::string();
}

}  // namespace fotomill::platform
