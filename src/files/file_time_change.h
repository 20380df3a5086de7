#pragma once

#include <cstdint>
#include <optional>
#include <string>
#include <string_view>

#include "core/status.h"
#include "files/times_log.h"
#include "platform/files.h"

namespace fotomill {

// A new time for files: the same for all, that of each picture, or one after the other.
struct FileTimeRule {
  bool taken = false;  // when the picture was taken, by local time
  // else this, seconds since 1970 UTC; none: the first file's time
  std::optional<int64_t> start = {};
  int64_t increment = 0;         // seconds from one file to the next; not with `taken`
  bool setsAccess = false;       // set the time of the last access
  bool setsModification = true;  // and that of the last modification
};

// The result for one file.
struct FileTimeChange {
  Status status = Status::Ok;
  std::string hint = {};            // reason for a failure, a sentence
  platform::ExactTime before = {};  // its modification time
  platform::ExactTime after = {};   // the new time
  ChangedTimes changed = {};        // all that was set, for undo
  bool logged = true;               // it can be undone by UndoTimes
};

// Sets the times of files in turn.
class FileTimeChanger {
 public:
  // Changes are recorded in `log`, if not null, before they are made.
  FileTimeChanger(const FileTimeRule& rule, bool dryRun, TimesLog* log = nullptr)
      : rule_(rule), dryRun_(dryRun), log_(log) {}

  // Changes the next file. `taken` is its date as in PictureTags; used only if the rule says so.
  // FileOpenError (1), InformationError (7) without a date, ErrorWritingFile (11) if the system
  // refuses. Files that fail do not count in a sequence.
  FileTimeChange Change(const std::string& path, int64_t taken);

 private:
  void Set(FileTimeChange& change);

  FileTimeRule rule_;
  const bool dryRun_;
  TimesLog* const log_;
  bool begun_ = false;
};

// Gives a file the times it had before a change, unless it was changed since. `before` and `after`
// of the result are its present and its old modification time. FileOpenError (1) if it is gone,
// ErrorWritingFile (11) if it was changed or the system refuses.
FileTimeChange UndoTimes(const ChangedTimes& changed, bool dryRun);

// Parses a local time: "2024-05-31 14:03:09", also with colons in the date and T before the time;
// without seconds, or without time for midnight; or "now". In seconds since 1970 UTC.
std::optional<int64_t> ParseLocalTime(std::string_view text);
// Formats it: "2024-05-31 14:03:09", local time.
std::string LocalTimeText(int64_t seconds);

}  // namespace fotomill
