#pragma once

#include <cstdint>
#include <functional>
#include <memory>
#include <string>
#include <string_view>
#include <vector>

#include "catalog/history/file_history.h"
#include "files/times_log.h"
#include "platform/file_times.h"
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
  Times,   // the times of `from` were set
};

class PreviousFile;

// A sidecar or comment file that went along with a picture.
struct FileAlong {
  std::string path;
  platform::FileStamp made = {};  // its state, if it is a copy
};

// One file of an operation; absolute paths.
struct FileStep {
  std::string from;
  std::string to;  // empty for Trash, Turn, Tag, Change and Times
  // Turn, Tag, Change: the previous contents; after Revert, those before the undo
  std::shared_ptr<PreviousFile> previous = {};
  // Copy: the state of the new file when it was made; not there: it is a folder
  platform::FileStamp made = {};
  // Times: those before and after they were set
  platform::FileTimes oldTimes = {}, newTimes = {};
  // Trash: the sidecars and the comment file that went along; Copy: their copies
  std::vector<FileAlong> along = {};
  // Trash: the state that the file must have; not there: any
  platform::FileStamp seen = {};
};

// The step for a file whose times were set.
FileStep TimesStep(const ChangedTimes& changed);

// The steps of one operation, in order.
struct FileOperation {
  FileOperationKind kind = FileOperationKind::Rename;
  std::vector<FileStep> steps;
  std::string commentExtension = {};  // as in FileOperationOptions
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
  // of text files with comments beside pictures, "photo.jpg.txt"; empty: there are none
  std::string commentExtension = {};
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
// by then. Keeps file times. Sidecars and comment files go along with their pictures; a sidecar
// that pictures share goes with the last one, and with each copy. Thumbnail files follow their
// pictures or are deleted with them, and database records of pictures that are no longer there are
// marked as deleted. May take long; any thread.
FileOperationResult CarryOut(const FileOperation& operation,
                             const FileOperationProgress& progress = {});
// Undoes an operation, last step first: files are moved back, outputs and unmodified copies go to
// the trash. Times are left alone if the file was changed since.
FileOperationResult Revert(const FileOperation& operation,
                           const FileOperationProgress& progress = {});

// Carries out a Trash operation by permanently deleting files, and folders with their contents,
// with their thumbnails, sidecars and comment files. The completed steps cannot be undone.
FileOperationResult DeleteForGood(const FileOperation& operation,
                                  const FileOperationProgress& progress = {});

// Uses to record in the file history after an operation, or with `back` after undoing it: new paths
// of renamed and moved files, copied and turned files, and removed ones.
std::vector<FileUse> UsesOf(const FileOperation& operation, bool back = false);

// "rename of 12 files", "move of beach.jpg"
std::string FileOperationName(const FileOperation& operation);

}  // namespace fotomill
