#pragma once

#include <cstdint>
#include <optional>
#include <string>
#include <vector>

#include "files/undo_log.h"

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

// Log of the last run's renames, "FMWRenameUndo.dat": old and new paths; a record with an empty old
// path has a number instead of the new path. Readers check which files really have the new name.
class RenameLog {
 public:
  explicit RenameLog(std::optional<uint32_t> number = {});

  // As in UndoLog.
  bool Intend(const RenamedFile& file) { return log_.Intend({file.from, file.to}); }
  void Settle(bool renamed) { log_.Settle(renamed); }
  bool LockForUndo() { return log_.LockForUndo(); }

 private:
  UndoLog log_;
};

// nullopt if the log exists but cannot be read.
std::optional<RenameHistory> ReadRenameLog();
// Replaces the log; deletes it if there are no files.
[[nodiscard]] bool WriteRenameLog(const RenameHistory& history);

}  // namespace fotomill
