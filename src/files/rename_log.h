#pragma once

#include <cstdint>
#include <optional>
#include <span>
#include <string>
#include <vector>

#include "platform/store_file.h"

namespace fotomill {

// A renamed file; absolute paths.
struct RenamedFile {
  std::string from, to;

  bool operator==(const RenamedFile&) const = default;
};

// The contents of the log. `number` is the first sequence number of the run, if sequence numbers
// are kept between runs.
struct RenameHistory {
  std::vector<RenamedFile> files;
  std::optional<uint32_t> number;
};

// Log of the last run's renames, for undo: "FMWRenameUndo.dat" in the data
// folder. For each file the old path, a NUL, the new path, a NUL; a record
// with an empty old path has a number instead of the new path. An incomplete
// record at the end is ignored. Renames are logged before they are done, so
// that none is lost; readers check which files really have the new name.
// Concurrent runs share one log, which is locked during each rename.
class RenameLog {
 public:
  explicit RenameLog(std::optional<uint32_t> number = {}) : number_(number) {}

  // Logs an upcoming rename and keeps the log locked until Settle. The first call starts a new log,
  // unless other runs are writing to it. False if it cannot be written.
  bool Intend(const RenamedFile& file);
  // Records whether the file was renamed.
  void Settle(bool renamed);
  // Locks the log, if there is one, for the lifetime of this object. Intend and Settle then append
  // to it without unlocking. False if locking fails.
  bool LockForUndo();

 private:
  bool LockFile(bool create);
  bool Begin(bool fresh);
  bool Append(const RenamedFile& file);

  std::optional<uint32_t> number_;
  platform::StoreFile file_;
  uint64_t before_ = 0;  // size without the pending record
  bool failed_ = false, locked_ = false;
  bool forUndo_ = false;
};

// nullopt if the log exists but cannot be read.
std::optional<RenameHistory> ReadRenameLog();
// Replaces the log; deletes it if there are no files.
[[nodiscard]] bool WriteRenameLog(const RenameHistory& history);

}  // namespace fotomill
