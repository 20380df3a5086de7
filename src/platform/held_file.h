#pragma once

#include <cstdint>
#include <string>

#include "platform/store_file.h"

namespace fotomill::platform {

// Identifies a file and its state, to detect changes. Links are followed.
struct FileStamp {
  bool there = false;
  bool link = false;  // the name itself is a link
  uint64_t device = 0, identity = 0, size = 0;
  int64_t modified = 0;  // nanoseconds since 1970, in the file system's resolution
  bool operator==(const FileStamp&) const = default;
};
FileStamp StampOf(const std::string& path);

// A file about to be replaced. While it is held, other instances of this program wait to hold it,
// and OutputFile replaces it only if it has not changed since: if another program has modified it,
// the commit fails and Changed() returns true.
class HeldFile {
 public:
  HeldFile() = default;
  HeldFile(const HeldFile&) = delete;
  HeldFile& operator=(const HeldFile&) = delete;
  ~HeldFile() { Release(); }

  // Waits for the file's lock, then records its state. A file that is missing, or cannot be locked
  // on its file system, is recorded without a lock. False if another program did not release the
  // lock, or if this one was asked to end; the reason is kept.
  [[nodiscard]] bool Hold(const std::string& path);
  void Release();
  bool IsHeldAs(const std::string& path) const;
  // The state of the file when it was held.
  const FileStamp& Stamp() const { return stamp_; }
  // Whether a commit found the file changed.
  bool Changed() const { return changed_; }

  // For OutputFile: whether any HeldFile holds a
  // path, with its stamp; and marks it as changed.
  static bool Find(const std::string& path, FileStamp& stamp);
  static void SetChanged(const std::string& path);

 private:
  void Enter(const std::string& path);

  std::string path_;  // absolute; empty while nothing is held
  FileStamp stamp_;
  bool changed_ = false;
  StoreFile lock_;
};

}  // namespace fotomill::platform
