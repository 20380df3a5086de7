#pragma once

#include <wx/event.h>

#include <functional>
#include <string>
#include <vector>

#include "core/workers/background_task.h"
#include "files/file_operation.h"
#include "processing/geometry/orient.h"

namespace fotomill::desktop {

class Shell;

// What the frame does to files: apart, one thing after the other, told of in the status bar, and
// kept so that it can be taken back.
class FileActions : public wxEvtHandler {
 public:
  explicit FileActions(Shell& shell);  // the shell outlives it
  ~FileActions() override = default;

  // False when there is no trash and the user, being asked, declined.
  bool Trash(const std::vector<std::string>& paths);
  // The same of a file that `view` shows; asks first if PromptDeleteFromView wants it. False when
  // the answer was no, or other files are in progress.
  bool TrashFromView(wxWindow* view, const std::string& path);
  // Asks first. False when the answer was no.
  bool Delete(const std::vector<std::string>& paths);
  // Copies files and folders; a name that is taken gets a number.
  void CopyTo(const std::vector<std::string>& paths, const std::string& folder);
  // Moves them; where a name is taken, that one stays and is told of.
  void MoveTo(const std::vector<std::string>& paths, const std::string& folder);
  // Files were dropped on a folder.
  void Drop(const std::vector<std::string>& paths, const std::string& folder, bool move);
  // `name` without a folder; reports when it is taken.
  void Rename(const std::string& path, const std::string& name);
  // Several files at once, as the caller has planned it.
  void RenameAll(std::vector<FileStep> steps);
  void NewFolder(const std::string& parent);  // asks for its name
  // Turns the picture in a file; `then` is told whether that was done, with a remark. False when
  // something else is being done.
  using Turned = std::function<void(bool done, const std::string& note)>;
  bool SaveTurned(const std::string& path, Orientation turn, Turned then);

  // Takes back what was done last, or does it again; nothing while something is being done.
  void Undo();
  void Redo();  // what Undo took back last
  // Somebody else did it; it can be taken back like the rest.
  void NoteDone(FileOperation operation) { undo_.Add(std::move(operation)); }
  const UndoList& Undoable() const { return undo_; }  // for the state and names of Undo and Redo
  void SettingsChanged();              // applies UndoLevels
  bool Busy() const { return busy_; }  // something is being done; nothing else can begin
  void Stop() { task_.Stop(); }

  // The clipboard holds the files for other programs too; `cut` asks whoever pastes to move them.
  void ToClipboard(const std::vector<std::string>& paths, bool cut);
  void PathsToClipboard(const std::vector<std::string>& paths);  // as text, a path a line
  // Files, or else a picture, which becomes a file.
  void Paste(const std::string& folder);

 private:
  using Work = std::function<FileOperationResult(const FileOperationProgress& progress)>;
  using Then = std::function<void(FileOperationResult result)>;
  void Run(const std::string& what, Work work, Then then);
  void Do(FileOperationKind kind, const std::vector<std::string>& paths, const std::string& folder);
  void Finished(const std::string& what, FileOperationResult result, const Then& then);
  void PastePicture(const std::string& folder);
  // Windows that show a renamed or moved folder go with it.
  void Follow(const FileOperation& operation, bool back);
  // Such windows, and the file history.
  void Took(const FileOperation& operation, bool back);
  void ReportFailures(const std::vector<FileOperationFailure>& failures);

  Shell& shell_;
  UndoList undo_;
  bool busy_ = false;
  BackgroundTask task_;  // last: it uses the rest
};

// Functions of the frame's menu.
void TrashSelection(Shell& shell);
void DeleteSelection(Shell& shell);  // for good, after asking
void CopySelectionTo(Shell& shell);  // asks for the folder
void MoveSelectionTo(Shell& shell);  // asks for the folder

}  // namespace fotomill::desktop
