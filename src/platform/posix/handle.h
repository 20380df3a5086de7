#pragma once

#include <sys/stat.h>

#include <atomic>
#include <cstdint>
#include <string>

#include "platform/output_file.h"

namespace fotomill::platform {

// An open file descriptor that closes itself.
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

  // The system's number, -1 for none. Release hands the file over to the caller, who closes it.
  int Number() const { return number_; }
  bool IsOpen() const { return number_ >= 0; }
  // Hands the number out; it is the caller's to close.
  int Release() {
    const int number = number_;
    number_ = -1;
    return number;
  }
  // Closes it and takes over `number`; false when closing reported an error (a write that came too
  // late).
  bool Reset(int number = -1);

 private:
  int number_;
};

// open(2) with O_CLOEXEC, repeated when a signal interrupts it.
Handle OpenHandle(const char* path, int flags, mode_t mode = 0);
// Opens a regular file and tells its facts. Nothing else opens: not a folder, FIFO, device or
// socket, judged before opening (opening a device can set it in motion) and again on the open
// handle. Never blocks. errno tells why it failed.
Handle OpenRegular(const char* path, int flags, struct stat& facts);

// Reads until `size` bytes or the end of the file; the number of bytes read, -1 on an error.
// `offset` -1 reads on from the handle's position.
int64_t ReadFully(int handle, uint8_t* data, uint64_t size, int64_t offset = -1);
// Writes all of it, or answers false.
bool WriteFully(int handle, const uint8_t* data, uint64_t size, int64_t offset = -1);

// Whether outputs are made without a name and get it when they are whole (O_TMPFILE). Tests walk
// the ways of systems that cannot make such files, or that make them and then refuse the name.
enum class UnnamedFiles { Work, DoNotWork, GetNoName };
extern std::atomic<UnnamedFiles> unnamedFiles;  // which of them is taken; tests change it

// fsync(2), repeated when a signal interrupts it.
bool SyncHandle(int handle);
// The folder of a path as it can be opened: "." for a bare name.
std::string OpenableFolderOf(const std::string& path);
// Makes the names in the folder of `path` last. Its failure is not reported: the file itself is in
// place, and some file systems cannot do it.
void SyncFolderOf(const std::string& path);

// Gives `from` the name `to` unless that is taken, in one step: by the rename that refuses, else by
// a hard link, else (file systems that know neither) by taking the name with an empty file first.
CommitResult RenameRefusing(const std::string& from, const std::string& to);
// The first of these ways that is tried; tests begin further down than the system would need to.
enum class RefusingRename { Directly, ByLink, ByPlaceholder };
extern std::atomic<RefusingRename> refusingRename;  // where it begins; tests change it

}  // namespace fotomill::platform
