#pragma once

#include <map>
#include <memory>
#include <mutex>
#include <string>

#include "files/file_operation.h"
#include "platform/held_file.h"
#include "platform/temporary_file.h"

namespace fotomill {

// The contents of a file before a function replaced it, kept in the data folder as long as that can
// be undone.
class PreviousFile {
 public:
  // Saves the current contents, or remembers that there is no file. False if there is not enough
  // disk space.
  [[nodiscard]] bool Keep(const std::string& path);
  // To be called after replacing the file; remembers its new state.
  void Replaced(const std::string& path) { replaced_ = platform::StampOf(path); }
  // Whether the file was modified since it was replaced.
  bool HasChanged(const std::string& path) const;
  // To be called after the kept contents were put back: those of `now`, kept just before, take
  // their place.
  void PutBack(const std::string& path, PreviousFile& now);
  // After that: the state that was put back is now that of another file.
  void Update(platform::FileStamp& state) const {
    if (state == restored_) state = replaced_;
  }
  // After `other` was put back: if that restored the state this one left, it goes on from there.
  void Follow(const PreviousFile& other) { other.Update(replaced_); }
  const std::string& Path() const { return kept_.Path(); }  // empty: there was no file

 private:
  platform::TemporaryFile kept_;
  platform::FileStamp original_;  // the file whose contents are kept
  platform::FileStamp replaced_;  // the file after it was replaced or put back
  platform::FileStamp restored_;  // the state that was put back last; its copy is `replaced_`
};

// The previous files of one batch. Thread-safe.
class PreviousFiles {
 public:
  // `kind`: of the operation, Turn, Tag or Change.
  explicit PreviousFiles(FileOperationKind kind = FileOperationKind::Turn) : kind_(kind) {}
  // Call before replacing a file. If false, do not replace it.
  [[nodiscard]] bool Keep(const std::string& path);
  // Call right after replacing a file passed to Keep; later changes are attributed to other
  // programs.
  void Replaced(const std::string& path);
  // An operation with all replaced files, ordered by path; ownership moves to the caller.
  FileOperation Operation() { return Operation(kind_); }
  FileOperation Operation(FileOperationKind kind);

 private:
  const FileOperationKind kind_;
  std::mutex mutex_;
  std::map<std::string, std::shared_ptr<PreviousFile>> kept_, replaced_;
};

// Deletes what killed programs left in the data folder more than a month ago.
void DeleteOldPreviousFiles();

}  // namespace fotomill
