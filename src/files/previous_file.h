#pragma once

#include <functional>
#include <map>
#include <memory>
#include <mutex>
#include <string>
#include <utility>

#include "files/file_operation.h"
#include "platform/held_file.h"
#include "platform/temporary_file.h"

namespace fotomill {

// What a file was before a function replaced it, kept in the data folder until no one can undo that
// any more.
class PreviousFile {
 public:
  // Keeps the file as it is now. False if there is no room for it.
  [[nodiscard]] bool Keep(const std::string& path);
  // The file was replaced; what it is now is remembered.
  void Replaced(const std::string& path) { replaced_ = platform::StampOf(path); }
  // Whether another program has changed the file since it was replaced.
  bool HasChanged(const std::string& path) const;
  void Swap(PreviousFile& other) { kept_.Swap(other.kept_); }
  const std::string& Path() const { return kept_.Path(); }

 private:
  platform::TemporaryFile kept_;
  platform::FileStamp replaced_;
};

// The previous files of one batch; from any thread.
class PreviousFiles {
 public:
  // `replacing` is told of each file before it is replaced, on the thread that replaces it.
  explicit PreviousFiles(std::function<void(const std::string& path)> replacing = {})
      : replacing_(std::move(replacing)) {}
  // To be called before a file is replaced. False: it should not be.
  [[nodiscard]] bool Keep(const std::string& path);
  // To be called at once when a file that was kept has been replaced; what it becomes later is
  // another program's work.
  void Replaced(const std::string& path);
  // The operation of those that were replaced, in the order of their paths; they are handed over.
  FileOperation Operation();

 private:
  const std::function<void(const std::string& path)> replacing_;
  std::mutex mutex_;
  std::map<std::string, std::shared_ptr<PreviousFile>> kept_, replaced_;
};

// Deletes what a program that was killed a month ago or longer left in the data folder.
void DeleteOldPreviousFiles();

}  // namespace fotomill
