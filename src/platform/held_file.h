#pragma once

#include <cstdint>
#include <string>

#include "platform/store_file.h"

namespace fotomill::platform {

// What tells one state of a file from another. Links are followed.
struct FileStamp {
  bool there = false;
  bool link = false;  // the name itself is a link
  uint64_t device = 0, identity = 0, size = 0;
  int64_t modified = 0;  // nanoseconds since 1970, as precise as the system keeps it
  bool operator==(const FileStamp&) const = default;
};
FileStamp StampOf(const std::string& path);

// A file that is going to be replaced. While it is held, other runs of this program that want to
// hold it wait, and an OutputFile takes its place only if it still is what it was when it was held:
// what another program has written meanwhile stays, the commit fails and Changed() turns true.
class HeldFile {
 public:
  HeldFile() = default;
  HeldFile(const HeldFile&) = delete;
  HeldFile& operator=(const HeldFile&) = delete;
  ~HeldFile() { Release(); }

  // Waits for the file's lock, then remembers the file as it is. A file that is not there, or that
  // cannot be locked on its file system, is remembered anyway. False when another program did
  // not give up the lock, or when this one was asked to end; the reason is kept.
  [[nodiscard]] bool Hold(const std::string& path);
  void Release();
  bool IsHeldAs(const std::string& path) const;
  // The file as it was when it was held.
  const FileStamp& Stamp() const { return stamp_; }
  // Whether a commit found the file changed.
  bool Changed() const { return changed_; }

  // For OutputFile: whether a path is held by anybody, with its stamp; and that it was found
  // changed.
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
