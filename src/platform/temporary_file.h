#pragma once

#include <cstdint>
#include <span>
#include <string>
#include <string_view>

namespace fotomill::platform {

// A working file that is deleted with its owner, and that only its user may read: a unique name with the prefix "FMWT" in
// the temporary folder, or, when none of at most 260 characters can be had there, "TEMP$$$.$$$" in the working folder.
// Always created exclusively; a link of that name is never followed.
class TemporaryFile {
 public:
  TemporaryFile() = default;
  TemporaryFile(const TemporaryFile&) = delete;
  TemporaryFile& operator=(const TemporaryFile&) = delete;
  ~TemporaryFile() { Delete(); }

  // Creates the empty file, its name ending in `extension` (with dot, ".tmp" by default; the fall-back name is then
  // "TEMP$$$" with that extension). False when neither name can be had; a file that was held before is gone then too.
  [[nodiscard]] bool Create(std::string_view extension = {});
  // Makes `bytes` the whole contents. False when not all could be written.
  [[nodiscard]] bool Write(std::span<const uint8_t> bytes);
  const std::string& Path() const { return path_; }
  void Delete();

 private:
  std::string path_;
  int listed_ = -1;  // its number among the names that go when the program is ended at once
};

}  // namespace fotomill::platform
