#pragma once

#include <cstdint>
#include <span>
#include <string>

namespace fotomill::platform {

// A file that is read and written in place, with an exclusive lock that dies with the process: what
// stores are made of.
class StoreFile {
 public:
  StoreFile() = default;
  StoreFile(StoreFile&& other) noexcept;
  StoreFile& operator=(StoreFile&& other) noexcept;
  ~StoreFile() { Close(); }

  enum class Mode { Read, ReadWrite, CreateNew };  // CreateNew fails when the name is taken
  // Exists: the name that CreateNew wanted is taken.
  enum class OpenResult { Done, Missing, Exists, Failed };
  // Opens a regular file; links are followed for reading only. A link that leads nowhere is Failed,
  // not Missing: who makes a new store where one merely could not be opened loses the old one.
  OpenResult Open(const std::string& path, Mode mode);
  void Close();  // the lock goes with it
  bool IsOpen() const { return handle_ != -1; }  // after Open was Done

  // Bytes that the file has now, whoever wrote them; 0 when it cannot be asked.
  uint64_t Size() const;
  int64_t Modified() const;  // nanoseconds since 1970, as precise as the system keeps it
  // All or nothing: false when fewer bytes were read or written.
  [[nodiscard]] bool ReadAt(uint64_t offset, std::span<uint8_t> bytes) const;
  // The file grows where it has to.
  [[nodiscard]] bool WriteAt(uint64_t offset, std::span<const uint8_t> bytes);
  // The same with bytes that are in two places, one after the other in the file.
  [[nodiscard]] bool ReadAt(uint64_t offset, std::span<uint8_t> first,
                            std::span<uint8_t> second) const;
  [[nodiscard]] bool WriteAt(uint64_t offset, std::span<const uint8_t> first,
                             std::span<const uint8_t> second);
  [[nodiscard]] bool Sync();  // what was written outlasts a power failure from here on
  // Cuts the file to that size, or makes it longer with zeros.
  [[nodiscard]] bool Resize(uint64_t size);
  // Waits for the exclusive lock on the file, which two StoreFiles never hold together, in one
  // process or in two. Advisory between programs that ask for it. False when it cannot be had, when
  // the program was asked to end meanwhile, and after ten seconds; only then a reason is kept,
  // which names the holder.
  [[nodiscard]] bool Lock();
  void Unlock();  // others may go on
  // Says until Close that the file is in use, which any number of StoreFiles may; and whether
  // others say so. Apart from Lock. Where locks do not work nothing is in use.
  bool MarkInUse();
  bool InUseByOthers() const;
  // Whether `path` still names this very file; after waiting for a lock another process may have
  // replaced it.
  bool IsStill(const std::string& path) const;
  // The same with its size and time, all in one question to the system.
  bool IsStill(const std::string& path, uint64_t& size, int64_t& modified) const;

 private:
  int64_t handle_ = -1;
  uint64_t device_ = 0, identity_ = 0;  // of the open file
};

// Holds a lock for a scope.
class StoreLock {
 public:
  // Waits as StoreFile::Lock.
  explicit StoreLock(StoreFile& file) : file_(file), held_(file.Lock()) {}
  ~StoreLock() {
    if (held_) file_.Unlock();
  }
  StoreLock(const StoreLock&) = delete;
  StoreLock& operator=(const StoreLock&) = delete;
  // False when the lock could not be had: the file must not be changed then.
  bool Held() const { return held_; }

 private:
  StoreFile& file_;
  bool held_;
};

}  // namespace fotomill::platform
