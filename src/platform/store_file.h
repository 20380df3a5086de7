#pragma once

#include <cstdint>
#include <span>
#include <string>

namespace fotomill::platform {

// A file read and written in place, with an exclusive lock that ends with the process. The
// basis of stores.
class StoreFile {
 public:
  StoreFile() = default;
  StoreFile(StoreFile&& other) noexcept;
  StoreFile& operator=(StoreFile&& other) noexcept;
  ~StoreFile() { Close(); }

  enum class Mode { Read, ReadWrite, CreateNew };  // CreateNew fails if the name exists
  // Exists: for CreateNew, the name exists.
  enum class OpenResult { Done, Missing, Exists, Failed };
  // Opens a regular file; links are followed only for reading. A dangling link is Failed, not
  // Missing, so that callers do not create a new store over one they merely could not open.
  OpenResult Open(const std::string& path, Mode mode);
  void Close();  // releases the lock
  bool IsOpen() const { return handle_ != -1; }  // true after Open returned Done

  // The current size in bytes; 0 if it cannot be determined.
  uint64_t Size() const;
  int64_t Modified() const;  // nanoseconds since 1970, in the file system's resolution
  // All or nothing: false if fewer bytes were read or written.
  [[nodiscard]] bool ReadAt(uint64_t offset, std::span<uint8_t> bytes) const;
  // The file grows as needed.
  [[nodiscard]] bool WriteAt(uint64_t offset, std::span<const uint8_t> bytes);
  // As above, with two buffers, consecutive in the file.
  [[nodiscard]] bool ReadAt(uint64_t offset, std::span<uint8_t> first,
                            std::span<uint8_t> second) const;
  [[nodiscard]] bool WriteAt(uint64_t offset, std::span<const uint8_t> first,
                             std::span<const uint8_t> second);
  [[nodiscard]] bool Sync();  // flushes all writes to disk
  // Truncates the file, or extends it with zeros.
  [[nodiscard]] bool Resize(uint64_t size);
  // Waits for the exclusive lock on the file, which only one StoreFile
  // can hold at a time, within and across processes. Advisory. False if
  // locking fails, after ten seconds, or if the program was asked to end;
  // only after the ten seconds is a reason kept, which names the holder.
  [[nodiscard]] bool Lock();
  void Unlock();  // releases the lock
  // Marks the file as in use until Close, shared with any number of StoreFiles; and whether any
  // other StoreFile has marked it. Independent of Lock. If locks do not work, nothing is in use.
  bool MarkInUse();
  bool InUseByOthers() const;
  // Whether `path` still names this file; while waiting for a lock, another process may have
  // replaced it.
  bool IsStill(const std::string& path) const;
  // As above, with size and time from the same system call.
  bool IsStill(const std::string& path, uint64_t& size, int64_t& modified) const;

 private:
  int64_t handle_ = -1;
  uint64_t device_ = 0, identity_ = 0;  // of the open file
};

// Holds a lock within a scope.
class StoreLock {
 public:
  // Waits as StoreFile::Lock does.
  explicit StoreLock(StoreFile& file) : file_(file), held_(file.Lock()) {}
  ~StoreLock() {
    if (held_) file_.Unlock();
  }
  StoreLock(const StoreLock&) = delete;
  StoreLock& operator=(const StoreLock&) = delete;
  // False if the lock was not obtained: the file must not be changed then.
  bool Held() const { return held_; }

 private:
  StoreFile& file_;
  bool held_;
};

}  // namespace fotomill::platform
