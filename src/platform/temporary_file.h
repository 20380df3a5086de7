#pragma once

#include <cstdint>
#include <span>
#include <string>
#include <string_view>
#include <utility>

namespace fotomill::platform {

// A working file that is deleted with its owner, and that only its user may read: a unique name
// with the prefix "FMWT" in the temporary folder, or, when none of at most 260 characters can be
// had there, "TEMP$$$.$$$" in the working folder. Always created exclusively; a link of that name
// is never followed.
class TemporaryFile {
 public:
  TemporaryFile() = default;
  TemporaryFile(const TemporaryFile&) = delete;
  TemporaryFile& operator=(const TemporaryFile&) = delete;
  ~TemporaryFile() { Delete(); }

  // Creates the empty file, its name ending in `extension` (with dot, ".tmp" by default; the
  // fall-back name is then "TEMP$$$" with that extension). False when neither name can be had; a
  // file that was held before is gone then too.
  [[nodiscard]] bool Create(std::string_view extension = {});
  // Makes `bytes` the whole contents. False when not all could be written.
  [[nodiscard]] bool Write(std::span<const uint8_t> bytes);
  // Becomes a file of `folder`, which is made when it is missing, with what the regular file `path`
  // holds now: that file itself under a second name where the file system can, else a copy of it
  // with its time. Who replaces `path` by a new file leaves this one as it is. False when that is
  // not possible; a file that was held before is gone then too.
  [[nodiscard]] bool Keep(const std::string& path, const std::string& folder);
  // Each owns the other's file.
  void Swap(TemporaryFile& other) {
    std::swap(path_, other.path_);
    std::swap(listed_, other.listed_);
  }
  // Where the file is; empty if there is none. Delete may be called at any time.
  const std::string& Path() const { return path_; }
  void Delete();  // does nothing where nothing is kept

 private:
  std::string path_;
  int listed_ = -1;  // its number among the names that go when the program is ended at once
};

}  // namespace fotomill::platform
