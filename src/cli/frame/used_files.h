#pragma once

#include <string>
#include <string_view>
#include <vector>

#include "catalog/history/file_history.h"
#include "settings/job_options.h"

namespace fotomill::cli {

// Collects the files used by a command and records them in the file history at the end. An error
// writing the history does not fail the command.
class UsedFiles {
 public:
  // `on` false: record nothing (dry runs, --no-history).
  UsedFiles(FileFunction function, bool on) : on_(on), function_(function) {}
  UsedFiles(const UsedFiles&) = delete;
  UsedFiles& operator=(const UsedFiles&) = delete;
  ~UsedFiles() {
    if (!uses_.empty()) (void)UpdateFileHistory(HistoryOptionsFromSettings(), uses_);
  }

  // Adds a processed file.
  void Add(const std::string& name);

 private:
  const bool on_;
  const FileFunction function_;
  std::vector<FileUse> uses_;
  std::string folder_, absoluteFolder_;  // of the last file, as a cache
};

}  // namespace fotomill::cli
