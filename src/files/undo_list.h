#pragma once

#include <cstddef>
#include <string>
#include <vector>

#include "files/file_operation.h"

namespace fotomill {

// Undo and redo history, limited in length.
class UndoList {
 public:
  explicit UndoList(size_t most) : most_(most) {}  // keeps at most that many operations
  // Changes the limit, dropping the oldest operations beyond it.
  void SetLimit(size_t most);
  // Adds an operation and clears the redo list.
  // Operations without steps are ignored.
  void Add(FileOperation operation);
  bool CanUndo() const { return !done_.empty(); }    // there is an operation to undo
  bool CanRedo() const { return !undone_.empty(); }  // there is an operation to redo
  // The next operation to undo, as FileOperationName; empty if none.
  std::string UndoName() const {
    return CanUndo() ? FileOperationName(done_.back()) : std::string();
  }
  // The next operation to redo; empty if none.
  std::string RedoName() const {
    return CanRedo() ? FileOperationName(undone_.back()) : std::string();
  }
  // Takes the next operation to undo or redo; return its result with Undone or Redone.
  FileOperation PopUndo();
  FileOperation PopRedo();               // as PopUndo; the list must not be empty
  void Undone(FileOperation operation);  // the steps that were undone; they can be redone
  void Redone(FileOperation operation);  // the steps that were redone
  // The steps of an operation that could not be undone, with the previous files they need: undone
  // again last, so that they are not in the way of others.
  void NotUndone(FileOperation operation);
  void NotRedone(FileOperation operation);  // the same for steps that could not be redone

 private:
  void Keep(std::vector<FileOperation>& list, FileOperation operation);
  void KeepLast(std::vector<FileOperation>& list, FileOperation operation) const;
  void FollowFiles(const FileOperation& operation);
  void Shorten(std::vector<FileOperation>& list) const;

  size_t most_;
  std::vector<FileOperation> done_, undone_;
};

}  // namespace fotomill
