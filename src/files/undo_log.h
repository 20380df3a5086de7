#pragma once

#include <cstdint>
#include <optional>
#include <string>
#include <utility>
#include <vector>

#include "platform/store_file.h"

namespace fotomill {

// One record of a log: two texts without NUL.
struct UndoRecord {
  std::string first, second;
};

// Log of what the last run of a command did, for undo: a file in the data folder. For each record
// the first text, a NUL, the second text, a NUL. An incomplete record at the end is ignored. What
// is done to a file is logged before it is done, so that none is lost; readers check the files.
// Concurrent runs share one log, which is locked during each change.
class UndoLog {
 public:
  // `name` is the file's name, a literal. `heading` becomes the first record of each run.
  explicit UndoLog(const char* name, std::optional<UndoRecord> heading = {})
      : name_(name), heading_(std::move(heading)) {}

  // Logs an upcoming change and keeps the log locked until Settle. The first call starts a new log,
  // unless other runs are writing to it. False if it cannot be written.
  bool Intend(const UndoRecord& record);
  // Records whether the change was made.
  void Settle(bool done);
  // Locks the log, if there is one, for the lifetime of this object. Intend and Settle then append
  // to it without unlocking. False if locking fails.
  bool LockForUndo();

 private:
  std::string Path() const;
  bool LockFile(bool create);
  bool Begin(bool fresh);
  bool Append(const UndoRecord& record);

  const char* const name_;
  std::optional<UndoRecord> heading_;
  platform::StoreFile file_;
  uint64_t before_ = 0;  // size without the pending record
  bool failed_ = false, locked_ = false;
  bool forUndo_ = false;
};

// The records of a log; none if there is no log. nullopt if it exists but cannot be read.
std::optional<std::vector<UndoRecord>> ReadUndoLog(const char* name);
// Replaces a log; deletes it if there are no records.
[[nodiscard]] bool WriteUndoLog(const char* name, const std::vector<UndoRecord>& records);

}  // namespace fotomill
