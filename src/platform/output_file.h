#pragma once

#include <cstdint>
#include <span>
#include <string>

namespace fotomill::platform {

// What Commit does about a file that already has the destination's name.
enum class Existing {
  Replace,  // take its place in one step; the old file's contents stay until then
  Refuse,   // fail, and leave it alone
};

// What became of giving a file its name.
enum class CommitResult {
  Done,
  Taken,   // Existing::Refuse, and the name was taken meanwhile
  Failed,  // a write, or giving the file its name, failed
};

// A file that appears under its name only when it is whole: bytes go to a sibling without a name,
// or with a temporary one where the file system knows no other, which Commit turns into the file.
// Without a Commit the sibling goes and nothing has changed, even when the program is killed. A
// file that takes another's place takes over its permissions.
class OutputFile {
 public:
  OutputFile() = default;
  OutputFile(const OutputFile&) = delete;
  OutputFile& operator=(const OutputFile&) = delete;
  ~OutputFile() { Discard(); }

  // Creates the sibling of `path`. False when the folder is missing or not writable, or when `path`
  // is there and is not a regular file or is write-protected (a symbolic link counts as a file of
  // its own and would be replaced, never followed).
  [[nodiscard]] bool Create(const std::string& path);
  // False once any write has failed.
  bool Write(std::span<const uint8_t> bytes);
  // Overwrites bytes that were written before.
  bool WriteAt(uint64_t offset, std::span<const uint8_t> bytes);
  // Gives the file its name. `sync` asks the system to have the contents on disk first; a file that
  // replaces another is always synced. After anything but Done there is no new file; Commit cannot
  // be tried again.
  [[nodiscard]] CommitResult Commit(Existing existing, bool sync = false);
  void Discard();  // deletes what was written; the destination stays unchanged

 private:
  bool CreateNamedSibling(unsigned mode);
  bool NameSibling();
  bool CopySibling();
  CommitResult TakeName(Existing existing, bool replaces, bool& synced);

  std::string path_;
  std::string temporary_;  // the sibling's name, empty while it has none
  int handle_ = -1;
  int listed_ = -1;  // the name's number among those that go when the program is ended at once
  bool failed_ = false;
};

// Whether a file of that name could be made now, with those folders of its path that are missing.
// False keeps the system's reason. For runs that only tell what they would do.
bool MayCreate(const std::string& path);

}  // namespace fotomill::platform
