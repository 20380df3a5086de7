#pragma once

#include <sys/mman.h>
#include <unistd.h>

#include <cstdint>
#include <cstdlib>
#include <string>

namespace fotomill::fuzz {

// A file in memory, rewritten in every run.
class MemoryFile {
 public:
  MemoryFile()
      : handle_(memfd_create("input", 0)), path_("/proc/self/fd/" + std::to_string(handle_)) {}
  const std::string& Fill(const uint8_t* data, size_t size) {
    if (ftruncate(handle_, 0) != 0 || pwrite(handle_, data, size, 0) != static_cast<ssize_t>(size))
      std::abort();
    return path_;
  }

 private:
  int handle_;
  std::string path_;
};

// A path, specific to this process, for files that a target needs on disk. The fuzzer exits without
// running exit handlers, so the starting script creates and removes the folder.
inline std::string ScratchPath(const char* name) {
  const char* const folder = std::getenv("TMPDIR");
  return std::string(folder == nullptr ? "/tmp" : folder) + "/" + name + "-" +
         std::to_string(getpid());
}

inline void Require(bool holds) {
  if (!holds) std::abort();
}

}  // namespace fotomill::fuzz
