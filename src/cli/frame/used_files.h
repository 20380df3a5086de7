#pragma once

#include <optional>
#include <string>
#include <string_view>
#include <vector>

#include "catalog/history/file_history.h"
#include "settings/job_options.h"

namespace fotomill::cli {

// What a command did to files, gathered while it runs and recorded in the file history when it ends. A history that
// cannot be written is no failure of the command.
class UsedFiles {
 public:
  // Without a function nothing is recorded.
  explicit UsedFiles(std::optional<FileFunction> function) : function_(function) {}
  UsedFiles(const UsedFiles&) = delete;
  UsedFiles& operator=(const UsedFiles&) = delete;
  ~UsedFiles() {
    if (!uses_.empty()) (void)UpdateFileHistory(HistoryOptionsFromSettings(), uses_);
  }

  // The command has just dealt with that file.
  void Add(const std::string& name);

 private:
  std::optional<FileFunction> function_;
  std::vector<FileUse> uses_;
  std::string folder_, absoluteFolder_;  // of the last file
};

}  // namespace fotomill::cli
