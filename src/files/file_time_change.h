#pragma once

#include <cstdint>
#include <optional>
#include <string>
#include <string_view>

#include "core/status.h"
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
};

// Sets the times of files in turn.
class FileTimeChanger {
 public:
  FileTimeChanger(const FileTimeRule& rule, bool dryRun) : rule_(rule), dryRun_(dryRun) {}

  // Changes the next file. `taken` is its date as in PictureTags; used only if the rule says so.
  // FileOpenError (1), InformationError (7) without a date, ErrorWritingFile (11) if the system
  // refuses. Files that fail do not count in a sequence.
  FileTimeChange Change(const std::string& path, int64_t taken);

 private:
  FileTimeRule rule_;
  const bool dryRun_;
  bool begun_ = false;
};

// Parses a local time: "2024-05-31 14:03:09", also with colons in the date and T before the time;
// without seconds, or without time for midnight; or "now". In seconds since 1970 UTC.
std::optional<int64_t> ParseLocalTime(std::string_view text);
// Formats it: "2024-05-31 14:03:09", local time.
std::string LocalTimeText(int64_t seconds);

}  // namespace fotomill
