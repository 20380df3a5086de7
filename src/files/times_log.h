#pragma once

#include <optional>
#include <string>
#include <vector>

#include "files/undo_log.h"
#include "platform/file_times.h"

namespace fotomill {

// A file whose times were set; an absolute path.
struct ChangedTimes {
  std::string path;
  platform::FileTimes before, after;
};

// Log of the last run that set file times, "FMWTimesUndo.dat": paths, and the times before and
// after as decimal numbers.
class TimesLog {
 public:
  TimesLog();

  // As in UndoLog.
  bool Intend(const ChangedTimes& file);
  void Settle(bool done) { log_.Settle(done); }
  bool LockForUndo() { return log_.LockForUndo(); }

 private:
  UndoLog log_;
};

// In the order in which they were set. nullopt if the log exists but cannot be read.
std::optional<std::vector<ChangedTimes>> ReadTimesLog();
// Replaces the log; deletes it if there are no files.
[[nodiscard]] bool WriteTimesLog(const std::vector<ChangedTimes>& files);

}  // namespace fotomill
