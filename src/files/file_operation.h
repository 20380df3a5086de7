#pragma once

#include <cstdint>
#include <functional>
#include <memory>
#include <string>
#include <string_view>
#include <vector>

#include "catalog/history/file_history.h"
#include "platform/held_file.h"

namespace fotomill {

// File operations that can be undone.
enum class FileOperationKind {
  Rename,
  Move,
  Copy,
  Trash,
  Create,  // a function wrote `to` from `from`; no file was replaced
  Turn,    // the picture in `from` was rotated or flipped
  Tag,     // keywords, ratings and the like were changed in `from`, a picture or its sidecar
  Change,  // the contents of `from` were changed
};

class PreviousFile;

// One file of an operation; absolute paths.
struct FileStep {
  std::string from;
  std::string to;  // empty for Trash, Turn, Tag and Change
  // Turn, Tag, Change: the previous contents; after Revert, those before the undo
  std::shared_ptr<PreviousFile> previous = {};
  // Copy: the state of the new file when it was made; not there: it is a folder
  platform::FileStamp made = {};
};

// The steps of one operation, in order.
struct FileOperation {
  FileOperationKind kind = FileOperationKind::Rename;
  std::vector<FileStep> steps;
};

// Why a step failed.
struct FileOperationFailure {
  std::string path;
  std::string reason;  // a complete sentence
};

// The result of an operation: the completed steps, and why others failed.
struct FileOperationResult {
  FileOperation done;
  std::vector<FileOperationFailure> failures;
  std::string note = {};  // a remark about the completed steps, a sentence
  std::vector<FileStep> left = {};  // the steps that failed
};

// Settings for an operation: the range for numbered
// names of copies, and the prefix of duplicates.
struct FileOperationOptions {
  int64_t firstVariant = 1, lastVariant = INT32_MAX;
  // of a copy in the same folder; if empty, adds a number instead
  std::string duplicatePrefix = {};
};

// Called before each step; return false to stop.
using FileOperationProgress = std::function<bool(size_t index, size_t count)>;

// The steps of an operation on files and folders: into `folder` under the same names, or into the
// trash. A move skips files already in `folder`; a copy in the same folder gets the prefix for
// duplicates. A name that is taken gets a number.
FileOperation PlanFileOperation(FileOperationKind kind, const std::vector<std::string>& paths,
                                const std::string& folder,
                                const FileOperationOptions& options = {});

// Performs the steps of an operation. Never replaces a file: a step fails if its destination exists
// by then. Keeps file times. Sidecars go along with files that are renamed, moved or copied.
// Thumbnail files follow their pictures or are deleted with them, and
// database records of pictures that are no longer there are marked as deleted. May take long; any
// thread.
FileOperationResult CarryOut(const FileOperation& operation,
                             const FileOperationProgress& progress = {});
// Undoes an operation, last step first: files are moved back, outputs and unmodified copies go to
// the trash.
FileOperationResult Revert(const FileOperation& operation,
                           const FileOperationProgress& progress = {});

// Permanently deletes files, and folders with their contents, and their thumbnails. The completed
// steps cannot be undone.
FileOperationResult DeleteForGood(const std::vector<std::string>& paths,
                                  const FileOperationProgress& progress = {});

// Uses to record in the file history after an operation, or with `back` after undoing it: new paths
// of renamed and moved files, copied and turned files, and removed ones.
std::vector<FileUse> UsesOf(const FileOperation& operation, bool back = false);

// "rename of 12 files", "move of beach.jpg"
std::string FileOperationName(const FileOperation& operation);

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
