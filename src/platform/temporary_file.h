#pragma once

#include <span>
#include <cstdint>
#include <string>
#include <string_view>

namespace fotomill::platform {

// A working file that is deleted with its owner: a unique name with the prefix "FMWT" in the temporary folder, or, when
// none can be had there, "TEMP$$$.$$$" in the working folder. Always created exclusively.
class TemporaryFile {
 public:
  TemporaryFile() = default;
  TemporaryFile(const TemporaryFile&) = delete;
  TemporaryFile& operator=(const TemporaryFile&) = delete;
  ~TemporaryFile() { Delete(); }

  // Creates the empty file, its name ending in `extension` (with dot, ".tmp" by default; the fall-back name is then
  // "TEMP$$$" with that extension). False when neither name can be had.
  [[nodiscard]] bool Create(std::string_view extension = {});
  // Fills it. False when not all could be written.
  [[nodiscard]] bool Write(std::span<const uint8_t> bytes);
  const std::string& Path() const { return path_; }
  void Delete();

 private:
  std::string path_;
};

}  // namespace fotomill::platform
