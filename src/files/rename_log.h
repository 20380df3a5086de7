#pragma once

#include <cstdint>
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

// What the log holds. `number` is the one with which the run began to count, where it is remembered
// for later runs.
struct RenameHistory {
  std::vector<RenamedFile> files;
  std::optional<uint32_t> number;
};

// The last run's renames, so that they can be taken back: "FMWRenameUndo.dat" in the data folder,
// for each file its old path, a zero byte, its new path, a zero byte. A record without an old path
// holds a number in place of the new one. A tail that is not whole does not count. A rename is
// noted before it is done, so that none can be lost; who reads the log finds out which files have
// their new names. Runs that go on at the same time write into one log, each rename under the log's
// lock.
class RenameLog {
 public:
  explicit RenameLog(std::optional<uint32_t> number = {}) : number_(number) {}

  // Notes what is going to be renamed and keeps the log locked until Settle; the first time begins
  // a new log, unless other runs are writing to it. False when it cannot be kept.
  bool Intend(const RenamedFile& file);
  // Says whether the file was renamed.
  void Settle(bool renamed);
  // Locks a log that is there, so that nobody adds to it until this object goes. False when the
  // lock cannot be had.
  bool LockForUndo();

 private:
  bool LockFile(bool create);
  bool Begin(bool fresh);
  bool Append(const RenamedFile& file);

  std::optional<uint32_t> number_;
  platform::StoreFile file_;
  uint64_t before_ = 0;  // the size without what is intended
  bool failed_ = false, locked_ = false;
};

// nullopt when there is a log that cannot be read.
std::optional<RenameHistory> ReadRenameLog();
// Replaces the log; one without files goes.
[[nodiscard]] bool WriteRenameLog(const RenameHistory& history);

}  // namespace fotomill
