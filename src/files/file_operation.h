#pragma once

#include <cstdint>
#include <functional>
#include <memory>
#include <string>
#include <string_view>
#include <vector>

namespace fotomill {

// Things done to files that can be undone.
enum class FileOperationKind {
  Rename,
  Move,
  Copy,
  Trash,
  Create,  // a function wrote `to` from `from`; no file was replaced
  Turn,    // the picture in `from` was rotated or flipped
};

class PreviousFile;

// One file of an operation, by absolute paths.
struct FileStep {
  std::string from;
  std::string to;                               // empty for Trash and Turn
  // Turn: what the file was before; after Revert, what it was before that
  std::shared_ptr<PreviousFile> previous = {};
};

// What was done in one go, in order.
struct FileOperation {
  FileOperationKind kind = FileOperationKind::Rename;
  std::vector<FileStep> steps;
};

// Why a step was not done.
struct FileOperationFailure {
  std::string path;
  std::string reason;  // a whole sentence
};

// What came of an operation: the steps that were done, and why others were not.
struct FileOperationResult {
  FileOperation done;
  std::vector<FileOperationFailure> failures;
  std::string note = {};  // a remark on what was done, as a sentence
};

// What an operation needs to know of the program's settings and of what else keeps records of
// files.
struct FileOperationOptions {
  // numbers of copies whose name is taken
  int64_t firstVariant = 1, lastVariant = INT32_MAX;
  // before a file gets other contents: thumbnails of it go
  std::function<void(const std::string& path)> replacing = {};
};

// Told before each step; false ends the operation there.
using FileOperationProgress = std::function<bool(size_t index, size_t count)>;

// The steps of an operation on files and folders: into `folder` under their own names, or into the
// trash. Files that are there already are left out of a move, and a copy gets a number, as it does
// where the name is taken.
FileOperation PlanFileOperation(FileOperationKind kind, const std::vector<std::string>& paths,
                                const std::string& folder,
                                const FileOperationOptions& options = {});

// Does the steps of an operation. Nothing is ever replaced: where a name is taken meanwhile the
// step fails. Files keep their times. May take long; any thread.
FileOperationResult CarryOut(const FileOperation& operation,
                             const FileOperationOptions& options = {},
                             const FileOperationProgress& progress = {});
// Undoes an operation, last step first: files go back to where they were, copies that no one has
// changed and outputs go to the trash.
FileOperationResult Revert(const FileOperation& operation, const FileOperationOptions& options = {},
                           const FileOperationProgress& progress = {});

// Deletes files permanently, and folders with what is in them.
FileOperationResult DeleteForGood(const std::vector<std::string>& paths,
                                  const FileOperationProgress& progress = {});

// "rename of 12 files", "move of beach.jpg"
std::string FileOperationName(const FileOperation& operation);

// What can be undone and redone, up to a number of operations.
class UndoList {
 public:
  explicit UndoList(size_t most) : most_(most) {}  // keeps that many
  // A new operation; what had been undone can no longer be redone. Operations without steps are not
  // kept.
  void Add(FileOperation operation);
  bool CanUndo() const { return !done_.empty(); }    // there is something to take back
  bool CanRedo() const { return !undone_.empty(); }  // something taken back can be done again
  // What Undo would take back, as FileOperationName says it; empty for nothing.
  std::string UndoName() const {
    return CanUndo() ? FileOperationName(done_.back()) : std::string();
  }
  // What Redo would do again; empty for nothing.
  std::string RedoName() const {
    return CanRedo() ? FileOperationName(undone_.back()) : std::string();
  }
  // Hands out the step to undo or redo; the result comes back by Undone or Redone.
  FileOperation PopUndo();
  FileOperation PopRedo();               // as PopUndo; the list must not be empty
  void Undone(FileOperation operation);  // the steps that were taken back; they can be redone
  void Redone(FileOperation operation);  // the steps that were done again

 private:
  void Keep(std::vector<FileOperation>& list, FileOperation operation);

  const size_t most_;
  std::vector<FileOperation> done_, undone_;
};

}  // namespace fotomill
