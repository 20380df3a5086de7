#pragma once

#include <optional>
#include <span>
#include <string>
#include <vector>

#include "platform/store_file.h"

namespace fotomill {

// One file that was renamed; absolute paths.
struct RenamedFile {
  std::string from, to;
};

// The last run's renames, so that they can be taken back: "FMWRenameUndo.dat" in the data folder, for each file its old path,
// a zero byte, its new path, a zero byte. A tail that is not whole does not count.
class RenameLog {
 public:
  // Adds a rename that has happened; the first one begins a new log. False when it cannot be kept.
  bool Add(const RenamedFile& file);

 private:
  bool Begin();
  platform::StoreFile file_;
  uint64_t size_ = 0;
  bool failed_ = false;
};

// nullopt when there is a log that cannot be read.
std::optional<std::vector<RenamedFile>> ReadRenameLog();
// Replaces the log; an empty one goes.
[[nodiscard]] bool WriteRenameLog(std::span<const RenamedFile> files);

}  // namespace fotomill
