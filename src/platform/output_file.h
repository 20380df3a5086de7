#pragma once

#include <cstdint>
#include <span>
#include <string>

namespace fotomill::platform {

// What Commit does if the destination exists.
enum class Existing {
  Replace,  // replace it atomically; the old contents stay until then
  Refuse,   // fail, leaving it unchanged
};

// Result of Commit.
enum class CommitResult {
  Done,
  Taken,   // Existing::Refuse, and the name exists by now
  Failed,  // a write or the rename failed
};

// A file that appears under its name only when it is complete. Bytes go to an unnamed temporary
// file in the same folder (on file systems without these, one with a temporary name), which Commit
// renames. Without a Commit it is deleted and nothing has changed, even if the program is killed. A
// file that replaces another takes over its permissions.
class OutputFile {
 public:
  OutputFile() = default;
  OutputFile(const OutputFile&) = delete;
  OutputFile& operator=(const OutputFile&) = delete;
  ~OutputFile() { Discard(); }

  // Creates the temporary file for `path`. False if the folder is missing or not writable, or if
  // `path` exists and is not a regular file or is write-protected (a symbolic link counts as a file
  // and would be replaced, never followed).
  [[nodiscard]] bool Create(const std::string& path);
  // False if this or any earlier write has failed.
  bool Write(std::span<const uint8_t> bytes);
  // Overwrites bytes written earlier.
  bool WriteAt(uint64_t offset, std::span<const uint8_t> bytes);
  // Renames the file to its name. `sync` flushes the contents to disk first; a file that
  // replaces another is always synced. On any result but Done there is no new file, and Commit
  // cannot be retried.
  [[nodiscard]] CommitResult Commit(Existing existing, bool sync = false);
  void Discard();  // deletes the temporary file; the destination is unchanged

 private:
  bool CreateNamedSibling(unsigned mode);
  bool NameSibling();
  bool CopySibling();
  CommitResult TakeName(Existing existing, bool replaces, bool& synced);

  std::string path_;
  std::string temporary_;  // the temporary name, empty if there is none
  int handle_ = -1;
  int listed_ = -1;  // slot of the name in the list of files to delete if the program is killed
  bool failed_ = false;
};

// Whether a file could be created under that name, along with missing folders of its path. For dry
// runs. On false, the system's reason is kept.
bool MayCreate(const std::string& path);

}  // namespace fotomill::platform
