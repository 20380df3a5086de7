#pragma once

#include <string>

class wxFrame;

namespace fotomill::desktop {

class BatchRunner;
class BrowserTabs;
class ExternalPrograms;
class FileActions;
class FolderPane;
class FrameSession;
class FunctionToolbar;
class PictureWindows;
class SidePane;
class ThumbnailService;
class UseRecorder;

// Interface of the main window for commands, dialogs and windows. Its parts have separate headers;
// include only those needed. All of them live as long as the main window, which outlives the
// windows and dialogs opened from it.
class Shell {
 public:
  virtual ~Shell() = default;

  // The main window: parent of dialogs and other windows.
  virtual wxFrame& Window() = 0;

  virtual BrowserTabs& Tabs() = 0;         // the browsers, and the current selection
  virtual FolderPane& Folders() = 0;       // the folder tree with the favorites
  virtual SidePane& Side() = 0;            // preview and facts of the focused file
  virtual PictureWindows& Pictures() = 0;  // view and compare windows
  virtual FileActions& Files() = 0;        // renaming, copying, moving, deleting; undo
  virtual BatchRunner& Batches() = 0;      // functions on multiple files
  virtual ThumbnailService& Thumbnails() = 0;
  virtual UseRecorder& Uses() = 0;      // for the file history
  virtual ExternalPrograms& Programs() = 0;
  virtual FrameSession& Session() = 0;  // saved tabs and tab sets
  virtual FunctionToolbar& Toolbar() = 0;

  // Opens a folder in a tab, a picture in a view window, a sound or video with its own program.
  virtual void OpenPath(const std::string& path) = 0;
  // Call after files were written, renamed or deleted: updates all windows.
  virtual void FilesChanged() = 0;
  // Call after a file or folder may have been renamed: updates windows that show it or its
  // contents.
  virtual void FollowRename(const std::string& from, const std::string& to) = 0;
  // Call after settings have changed: updates all windows.
  virtual void SettingsChanged() = 0;
  // Shows a line in the status bar.
  virtual void Report(const std::string& text) = 0;
};

}  // namespace fotomill::desktop
