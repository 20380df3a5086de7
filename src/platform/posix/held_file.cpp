#include "platform/held_file.h"

#include <sys/stat.h>

#include <algorithm>
#include <mutex>
#include <vector>

#include "platform/folders.h"
#include "platform/process.h"
#include "platform/reason.h"

namespace fotomill::platform {

namespace {

constexpr int kMostReplacements = 1000;  // of a file while waiting for its lock

struct Registry {
  std::mutex mutex;
  std::vector<HeldFile*> files;
};

Registry& HeldFiles() {
  static Registry registry;
  return registry;
}

}  // namespace

FileStamp StampOf(const std::string& path) {
  FileStamp stamp;
  struct stat facts;
  if (lstat(path.c_str(), &facts) != 0) return stamp;
  stamp.link = S_ISLNK(facts.st_mode);
  if (stamp.link && stat(path.c_str(), &facts) != 0) return stamp;
  stamp.there = true;
  stamp.device = facts.st_dev;
  stamp.identity = facts.st_ino;
  stamp.size = static_cast<uint64_t>(facts.st_size);
  stamp.modified = int64_t{facts.st_mtim.tv_sec} * 1'000'000'000 + facts.st_mtim.tv_nsec;
  return stamp;
}

// By the time the lock is acquired, its previous holder may have replaced the file; then the new
// file is locked.
bool HeldFile::Hold(const std::string& path) {
  Release();
  changed_ = false;
  for (int tries = 0; tries < kMostReplacements; ++tries) {
    const StoreFile::OpenResult opened = lock_.Open(path, StoreFile::Mode::Read);
    ForgetReason();
    if (opened != StoreFile::OpenResult::Done) break;
    if (!lock_.Lock() && (!SystemReason().empty() || PendingExit() != 0)) {
      lock_.Close();
      return false;
    }
    if (lock_.IsStill(path)) break;
  }
  Enter(path);
  return true;
}

void HeldFile::Enter(const std::string& path) {
  stamp_ = StampOf(path);
  Registry& held = HeldFiles();
  const std::lock_guard lock(held.mutex);
  path_ = AbsolutePath(path);
  held.files.push_back(this);
}

bool HeldFile::IsHeldAs(const std::string& path) const {
  return !path_.empty() && path_ == AbsolutePath(path);
}

void HeldFile::Release() {
  if (!path_.empty()) {
    Registry& held = HeldFiles();
    const std::lock_guard lock(held.mutex);
    std::erase(held.files, this);
    path_.clear();
  }
  lock_.Close();
}

bool HeldFile::Find(const std::string& path, FileStamp& stamp) {
  Registry& held = HeldFiles();
  const std::lock_guard lock(held.mutex);
  if (held.files.empty()) return false;
  const std::string absolute = AbsolutePath(path);
  const auto found = std::ranges::find_if(
      held.files, [&](const HeldFile* file) { return file->path_ == absolute; });
  if (found != held.files.end()) stamp = (*found)->stamp_;
  return found != held.files.end();
}

void HeldFile::SetChanged(const std::string& path) {
  Registry& held = HeldFiles();
  const std::lock_guard lock(held.mutex);
  const std::string absolute = AbsolutePath(path);
  for (HeldFile* file : held.files) {
    if (file->path_ == absolute) file->changed_ = true;
  }
}

}  // namespace fotomill::platform
