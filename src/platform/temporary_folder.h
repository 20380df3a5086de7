#pragma once

#include <string>

namespace fotomill::platform {

// A private folder in the system's temporary folder, deleted with its contents by its owner.
// Leftovers of a killed program are deleted by the next one.
class TemporaryFolder {
 public:
  TemporaryFolder() = default;
  TemporaryFolder(const TemporaryFolder&) = delete;
  TemporaryFolder& operator=(const TemporaryFolder&) = delete;
  ~TemporaryFolder() { Delete(); }

  // Creates the empty folder. False on failure.
  // A previous folder is deleted in any case.
  [[nodiscard]] bool Create();
  const std::string& Path() const { return path_; }  // empty if there is none
  void Delete();

 private:
  std::string path_;
};

}  // namespace fotomill::platform
