#pragma once

#include <wx/event.h>
#include <wx/weakref.h>
#include <wx/window.h>

#include <deque>
#include <functional>
#include <string>
#include <vector>

#include "core/workers/background_task.h"
#include "files/file_operation.h"
#include "files/undo_list.h"
#include "metadata/tags/tag_edit.h"
#include "processing/geometry/orient.h"

namespace fotomill::desktop {

class Shell;

// The frame's file operations: run in the background, one at a time, reported in the status bar,
// and can be undone.
class FileActions : public wxEvtHandler {
 public:
  explicit FileActions(Shell& shell);  // must outlive this object
  ~FileActions() override = default;

  // Moves files to the trash without asking the user. If the files' folder has no trash, nothing is
  // moved, and a message box asks the user whether to delete them permanently.
  void Trash(const std::vector<std::string>& paths);
  // The same for a file shown in `view`, the parent of questions and messages; asks first,
  // depending on PromptDeleteFromView. `gone` is called when the file was deleted, also if it did
  // not exist any more.
  void TrashFromView(wxWindow* view, const std::string& path, std::function<void()> gone);
  // The same for the steps of a Trash operation; `parent` is that of questions and messages.
  void TrashSteps(wxWindow* parent, std::vector<FileStep> steps);
  void Delete(const std::vector<std::string>& paths);  // permanently, after asking
  // Copies files and folders; adds a number if a name is taken.
  void CopyTo(const std::vector<std::string>& paths, const std::string& folder);
  // Moves files and folders; reports taken names and skips them.
  void MoveTo(const std::vector<std::string>& paths, const std::string& folder);
  // Files were dropped on a folder.
  void Drop(const std::vector<std::string>& paths, const std::string& folder, bool move);
  // `name` without folder; reports if it is taken.
  void Rename(const std::string& path, const std::string& name);
  // Renames several files, as planned by the caller.
  void RenameAll(std::vector<FileStep> steps);
  void NewFolder(const std::string& parent);  // asks for its name
  // Turns the picture in a file; `then` is called with the result and a remark. False if another
  // operation is running.
  using Turned = std::function<void(bool done, const std::string& note)>;
  bool SaveTurned(const std::string& path, Orientation turn, Turned then);

  // Changes the tags of pictures; waits for a running operation.
  void Tag(const std::vector<std::string>& paths, const TagChanges& changes);

  // Undoes or redoes the last operation; does nothing while another one is running.
  void Undo();
  void Redo();  // the last one undone
  // Adds an operation done elsewhere, to be undone like others.
  void NoteDone(FileOperation operation) { undo_.Add(std::move(operation)); }
  const UndoList& Undoable() const { return undo_; }  // for the state and names of Undo and Redo
  void SettingsChanged();              // applies UndoLevels
  bool Busy() const { return busy_; }  // an operation is running; no other can start
  void Stop() { task_.Stop(); }

  // Puts files on the clipboard, also for other programs; `cut`: pasting moves them.
  void ToClipboard(const std::vector<std::string>& paths, bool cut);
  void PathsToClipboard(const std::vector<std::string>& paths);  // as text, one path per line
  // Pastes files, or else a picture as a new file.
  void Paste(const std::string& folder);

 private:
  using Work = std::function<FileOperationResult(const FileOperationProgress& progress)>;
  using Then = std::function<void(FileOperationResult result)>;
  // An operation's windows, and what follows it.
  struct Asker {
    wxWeakRef<wxWindow> parent;  // of messages; null: the frame
    std::function<void()> gone;  // called when all files of a deletion are gone
  };
  wxWindow* ParentOf(const Asker& asker) const;
  void Run(const std::string& what, Work work, Then then, const Asker& asker = {});
  void Trash(const FileOperation& operation, const Asker& asker);
  void Delete(const FileOperation& operation, const Asker& asker, bool noTrash);
  void Do(FileOperationKind kind, const std::vector<std::string>& paths, const std::string& folder);
  void Finished(const std::string& what, FileOperationResult result, const Then& then,
                const Asker& asker);
  void PastePicture(const std::string& folder);
  // Updates windows that show a renamed or moved folder.
  void Follow(const FileOperation& operation, bool back);
  void SelectResults(const FileOperation& operation, bool back);
  // Updates those windows and the file history.
  void Took(const FileOperation& operation, bool back);
  void ReportFailures(const std::vector<FileOperationFailure>& failures, wxWindow* parent);

  void StartTagging();

  Shell& shell_;
  UndoList undo_;
  struct Tagging {
    std::vector<std::string> paths;
    TagChanges changes;
  };
  std::deque<Tagging> tagging_;  // waiting
  bool busy_ = false;
  BackgroundTask task_;  // must be last: it uses the other members
};

// Functions of the frame's menu.
void TrashSelection(Shell& shell);
void DeleteSelection(Shell& shell);  // permanently, after asking
void CopySelectionTo(Shell& shell);  // asks for the folder
void MoveSelectionTo(Shell& shell);  // asks for the folder
// Asks for a description, or for keywords, of the selected pictures.
void CommentSelection(Shell& shell);
void KeywordSelection(Shell& shell);

}  // namespace fotomill::desktop
