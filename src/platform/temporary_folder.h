#pragma once

#include <string>

namespace fotomill::platform {

// A folder in the system's temporary folder that only its user may enter; it is deleted with its
// owner, with all that is in it. What a program that was killed left is deleted by the next one.
class TemporaryFolder {
 public:
  TemporaryFolder() = default;
  TemporaryFolder(const TemporaryFolder&) = delete;
  TemporaryFolder& operator=(const TemporaryFolder&) = delete;
  ~TemporaryFolder() { Delete(); }

  // Makes the empty folder. False when that is not possible; a folder that was held before is gone
  // then too.
  [[nodiscard]] bool Create();
  const std::string& Path() const { return path_; }  // empty if there is none
  void Delete();

 private:
  std::string path_;
};

}  // namespace fotomill::platform
