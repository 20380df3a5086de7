#pragma once

#include <sys/stat.h>

#include <atomic>
#include <cstdint>
#include <string>

#include "platform/output_file.h"

namespace fotomill::platform {

// An open file descriptor, closed by its destructor.
class Handle {
 public:
  explicit Handle(int number = -1) : number_(number) {}  // owns the number
  Handle(Handle&& other) noexcept : number_(other.Release()) {}
  Handle& operator=(Handle&& other) noexcept {
    if (this != &other) Reset(other.Release());
    return *this;
  }
  Handle(const Handle&) = delete;
  Handle& operator=(const Handle&) = delete;
  ~Handle() { Reset(); }

  // The file descriptor, -1 for none.
  int Number() const { return number_; }
  bool IsOpen() const { return number_ >= 0; }
  // Gives up ownership; the caller must close the descriptor.
  int Release() {
    const int number = number_;
    number_ = -1;
    return number;
  }
  // Closes it and takes ownership of `number`; false if closing reported an error (a
  // delayed write failed).
  bool Reset(int number = -1);

 private:
  int number_;
};

// open(2) with O_CLOEXEC, retried on EINTR.
Handle OpenHandle(const char* path, int flags, mode_t mode = 0);
// Opens a regular file and returns its stat. Anything else (folder, FIFO, device, socket) fails,
// checked before opening (opening a device can have side effects) and again on the open descriptor.
// Never blocks. Sets errno on failure.
Handle OpenRegular(const char* path, int flags, struct stat& facts);

// Reads until `size` bytes or the end of the file; returns the number of bytes read, -1 on an
// error. `offset` -1 reads from the current position.
int64_t ReadFully(int handle, uint8_t* data, uint64_t size, int64_t offset = -1);
// Writes all bytes, or returns false.
bool WriteFully(int handle, const uint8_t* data, uint64_t size, int64_t offset = -1);

// Whether output files can be created unnamed and linked when complete (O_TMPFILE). Tests simulate
// systems that cannot create such files, or that create them but cannot link them.
enum class UnnamedFiles { Work, DoNotWork, GetNoName };
extern std::atomic<UnnamedFiles> unnamedFiles;  // changed by tests only

// fsync(2), retried on EINTR.
bool SyncHandle(int handle);
// The folder of a path in a form that open() accepts: "." for a bare name.
std::string OpenableFolderOf(const std::string& path);
// Syncs the directory of `path`. Errors are ignored: the file itself is in place, and some file
// systems do not support it.
void SyncFolderOf(const std::string& path);

// Renames `from` to `to` atomically unless that name exists: by a no-replace rename, else by a hard
// link, else (file systems with neither) by reserving the name with an empty file first.
CommitResult RenameRefusing(const std::string& from, const std::string& to);
// The first method to try; tests start further down the list.
enum class RefusingRename { Directly, ByLink, ByPlaceholder };
extern std::atomic<RefusingRename> refusingRename;  // changed by tests only

}  // namespace fotomill::platform
