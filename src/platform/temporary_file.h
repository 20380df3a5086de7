#pragma once

#include <cstdint>
#include <span>
#include <string>
#include <string_view>
#include <utility>

namespace fotomill::platform {

// A private temporary file, deleted with its owner, readable only by the
// user: a unique name with the prefix "FMWT" in the temporary folder or,
// if that fails or exceeds 260 characters, "TEMP$$$.$$$" in the current
// folder. Always created exclusively; links are never followed.
class TemporaryFile {
 public:
  TemporaryFile() = default;
  TemporaryFile(const TemporaryFile&) = delete;
  TemporaryFile& operator=(const TemporaryFile&) = delete;
  ~TemporaryFile() { Delete(); }

  // Creates the empty file, its name ending in `extension` (with dot, ".tmp" by default; the
  // fallback name is then "TEMP$$$" with that extension). False if neither can be created. A
  // previous file is deleted in any case.
  [[nodiscard]] bool Create(std::string_view extension = {});
  // Replaces the contents. False if not all bytes could be written.
  [[nodiscard]] bool Write(std::span<const uint8_t> bytes);
  // Keeps the current contents of the regular file `path` in `folder` (created if missing): as a
  // hard link if the file system supports it, else as a copy with its modification time. Replacing
  // `path` by a new file leaves this one unchanged. False on failure. A previous file is deleted in
  // any case.
  [[nodiscard]] bool Keep(const std::string& path, const std::string& folder);
  // Exchanges the files of the two owners.
  void Swap(TemporaryFile& other) {
    std::swap(path_, other.path_);
    std::swap(listed_, other.listed_);
  }
  // Path of the file; empty if there is none. Delete may be called at any time.
  const std::string& Path() const { return path_; }
  void Delete();  // does nothing without a file

 private:
  std::string path_;
  int listed_ = -1;  // slot in the list of files to delete if the program is killed
};

}  // namespace fotomill::platform
