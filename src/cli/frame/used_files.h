#pragma once

#include <string>
#include <string_view>
#include <vector>

#include "catalog/history/file_history.h"
#include "settings/job_options.h"

namespace fotomill::cli {

// The files a command used, collected while it runs and recorded in the file history at its end.
// Failing to write the history is not a failure of the command.
class UsedFiles {
 public:
  // Nothing is recorded unless `on`: dry runs, --no-history.
  UsedFiles(FileFunction function, bool on) : on_(on), function_(function) {}
  UsedFiles(const UsedFiles&) = delete;
  UsedFiles& operator=(const UsedFiles&) = delete;
  ~UsedFiles() {
    if (!uses_.empty()) (void)UpdateFileHistory(HistoryOptionsFromSettings(), uses_);
  }

  // Adds a file that the command has just processed.
  void Add(const std::string& name);

 private:
  const bool on_;
  const FileFunction function_;
  std::vector<FileUse> uses_;
  std::string folder_, absoluteFolder_;  // of the last file
};

}  // namespace fotomill::cli
