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

enum class CommitResult {
  Done,
  Taken,   // Existing::Refuse, and the name was taken meanwhile
  Failed,  // a write, or giving the file its name, failed
};

// A file that appears under its name only when it is whole: bytes go to a sibling with a unique temporary name, which
// Commit renames. Without a Commit the destructor removes the sibling and nothing has changed.
class OutputFile {
 public:
  OutputFile() = default;
  OutputFile(const OutputFile&) = delete;
  OutputFile& operator=(const OutputFile&) = delete;
  ~OutputFile() { Discard(); }

  // Creates the sibling of `path`. False when the folder is missing or not writable, or when `path` is there and is not
  // a regular file (a symbolic link counts as a file of its own and would be replaced, never followed).
  [[nodiscard]] bool Create(const std::string& path);
  // False once any write has failed.
  bool Write(std::span<const uint8_t> bytes);
  // Overwrites bytes that were written before.
  bool WriteAt(uint64_t offset, std::span<const uint8_t> bytes);
  // Gives the file its name. `sync` asks the system to have the contents on disk first; a file that replaces another
  // is always synced.
  [[nodiscard]] CommitResult Commit(Existing existing, bool sync = false);
  void Discard();

 private:
  std::string path_;
  std::string temporary_;
  int handle_ = -1;
  bool failed_ = false;
};

}  // namespace fotomill::platform
