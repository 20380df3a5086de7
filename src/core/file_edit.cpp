#include "core/file_edit.h"

#include "platform/files.h"
#include "platform/held_file.h"
#include "platform/paths.h"
#include "platform/reason.h"
#include "platform/store_file.h"

namespace fotomill {

namespace {

// Holds the lock file of a path: creates it, and deletes it at the end. After waiting, the lock
// file may turn out to be deleted already; then it starts over.
class PathLock {
 public:
  explicit PathLock(const std::string& path) : path_(path + ".lock") {
    using platform::StoreFile;
    for (int tries = 0; tries < kMostTries && !held_; ++tries) {
      StoreFile::OpenResult opened = file_.Open(path_, StoreFile::Mode::ReadWrite);
      if (opened == StoreFile::OpenResult::Missing)
        opened = file_.Open(path_, StoreFile::Mode::CreateNew);
      if (opened == StoreFile::OpenResult::Exists) continue;  // another process was faster
      if (opened != StoreFile::OpenResult::Done || !file_.Lock()) return;
      held_ = file_.IsStill(path_);
      if (!held_) file_.Close();
    }
  }
  ~PathLock() {
    const std::string reason = platform::SystemReason();  // why the change failed
    if (held_) (void)platform::DeleteFile(path_);
    platform::KeepReason(reason);
  }
  PathLock(const PathLock&) = delete;
  PathLock& operator=(const PathLock&) = delete;
  bool Held() const { return held_; }

 private:
  static constexpr int kMostTries = 1000;
  std::string path_;
  platform::StoreFile file_;
  bool held_ = false;
};

constexpr int kMostChanges = 10;  // by other programs, between read and write

EditResult EditOnce(const std::string& path, uint64_t most,
                    const std::function<void(std::string& contents)>& edit) {
  std::string contents;
  switch (platform::ReadWholeFile(path, most, contents)) {
    case platform::ReadResult::Done:
    case platform::ReadResult::Missing: break;
    case platform::ReadResult::Failed:
    case platform::ReadResult::TooLarge: return EditResult::NotRead;
  }
  std::string changed = contents;
  edit(changed);
  if (changed == contents) return EditResult::Unchanged;
  if (changed.size() > most) return EditResult::Failed;  // it could not be read again
  return platform::WriteWholeFile(path, changed) ? EditResult::Done : EditResult::Failed;
}

}  // namespace

EditResult EditTextFile(const std::string& path, uint64_t most,
                        const std::function<void(std::string& contents)>& edit) {
  const platform::PathParts parts = platform::SplitPath(path);
  const std::string folder = std::string(parts.drive) + std::string(parts.folder);
  if (path.empty() || (!folder.empty() && !platform::MakeFolders(folder)))
    return EditResult::Failed;
  const PathLock lock(path);
  if (!lock.Held()) return EditResult::Failed;
  platform::HeldFile file;  // editors do not know our lock
  for (int tries = 0;; ++tries) {
    if (!file.Hold(path)) return EditResult::Failed;
    const EditResult result = EditOnce(path, most, edit);
    if (result != EditResult::Failed || !file.Changed() || tries == kMostChanges) return result;
  }
}

}  // namespace fotomill
