#include "platform/posix/attributes.h"

#include <fcntl.h>
#include <sys/xattr.h>
#include <unistd.h>

#include <cerrno>
#include <string_view>
#include <vector>

#include "platform/posix/handle.h"

namespace fotomill::platform {

namespace {

constexpr const char* kAccessList = "system.posix_acl_access";
constexpr size_t kMostTries = 3;  // attributes may grow between the calls

// Attributes of the file rather than of its contents; signatures and capabilities of the old
// contents are not copied.
bool GoesAlong(std::string_view name) {
  return name.starts_with("user.") || name.starts_with("trusted.") || name == "security.selinux" ||
         name == kAccessList;
}

// Attributes the system sets on new files by itself are not reported as lost.
bool IsMissed(std::string_view name) { return name.starts_with("user.") || name == kAccessList; }

// Calls a function that fills a buffer, growing the buffer as needed; false with errno.
template <typename Call>
bool ReadAll(Call call, std::vector<char>& into) {
  for (size_t attempt = 0; attempt < kMostTries; ++attempt) {
    const ssize_t size = call(nullptr, 0);
    if (size < 0) return false;
    into.resize(static_cast<size_t>(size));
    if (size == 0) return true;
    const ssize_t count = call(into.data(), into.size());
    if (count >= 0) {
      into.resize(static_cast<size_t>(count));
      return true;
    }
    if (errno != ERANGE) return false;
  }
  return false;
}

void Add(std::string& list, std::string_view what) {
  list.append(list.empty() ? "" : ", ").append(what);
}

// Owner and group; only the superuser can give files away. Group permissions are not granted to a
// different group.
void CopyOwner(const struct stat& old, int to, mode_t& mode, std::string& lost) {
  struct stat now;
  if (fstat(to, &now) != 0) return;
  if (now.st_gid != old.st_gid && fchown(to, static_cast<uid_t>(-1), old.st_gid) != 0) {
    Add(lost, "group");
    mode &= ~static_cast<mode_t>(S_IRWXG) | (mode & S_IRWXO) << 3;
  }
  if (now.st_uid != old.st_uid && fchown(to, old.st_uid, static_cast<gid_t>(-1)) != 0)
    Add(lost, "owner");
}

bool CopyOne(const char* path, const char* name, int to) {
  std::vector<char> value;
  if (!ReadAll([&](char* data, size_t size) { return lgetxattr(path, name, data, size); }, value))
    return errno == ENODATA;
  return fsetxattr(to, name, value.data(), value.size(), 0) == 0;
}

}  // namespace

std::string CopyAttributes(const std::string& path, const struct stat& old, int to) {
  std::string lost;
  mode_t mode = old.st_mode & 0777;
  CopyOwner(old, to, mode, lost);
  fchmod(to, mode);  // bypasses the umask; on failure there are fewer permissions, never more
  std::vector<char> names;
  if (!ReadAll([&](char* data, size_t size) { return llistxattr(path.c_str(), data, size); },
               names))
    names.clear();
  names.push_back('\0');
  bool accessList = false;
  for (const char* name = names.data(); *name != '\0'; name += std::string_view(name).size() + 1) {
    accessList = accessList || std::string_view(name) == kAccessList;
    if (GoesAlong(name) && !CopyOne(path.c_str(), name, to) && IsMissed(name)) {
      Add(lost, std::string_view(name) == kAccessList ? "access control list"
                                                      : "attribute " + std::string(name));
    }
  }
  // The folder's default ACL could grant access that the old file denied.
  if (!accessList && fremovexattr(to, kAccessList) == 0) fchmod(to, mode);
  return lost;
}

}  // namespace fotomill::platform
