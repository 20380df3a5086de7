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
class ThumbnailService;
class UseRecorder;

// What commands, dialogs and windows may ask of the program's window. Its parts have a header each;
// who needs one includes that. All of them live as long as the window, which outlives the windows
// and dialogs opened on it.
class Shell {
 public:
  virtual ~Shell() = default;

  // The window itself: the parent of dialogs and other windows.
  virtual wxFrame& Window() = 0;

  virtual BrowserTabs& Tabs() = 0;         // the browsers, and what is selected in the one in front
  virtual FolderPane& Folders() = 0;       // the folder tree at the left, and the favorites in it
  virtual PictureWindows& Pictures() = 0;  // view windows and those that compare
  virtual FileActions& Files() = 0;        // renames, copies, moves, deletes; undo
  virtual BatchRunner& Batches() = 0;      // functions over many files
  virtual ThumbnailService& Thumbnails() = 0;
  virtual UseRecorder& Uses() = 0;      // for the file history
  virtual ExternalPrograms& Programs() = 0;
  virtual FrameSession& Session() = 0;  // tabs that are kept, under their own names too
  virtual FunctionToolbar& Toolbar() = 0;

  // Opens a folder in a tab, a picture in a view window, a sound or video with its own program.
  virtual void OpenPath(const std::string& path) = 0;
  // Files were written, renamed or deleted: every window looks again.
  virtual void FilesChanged() = 0;
  // A file or folder may have got another name: what shows it, or is in it, continues under that
  // one.
  virtual void FollowRename(const std::string& from, const std::string& to) = 0;
  // Settings have changed: every window shows what they say now.
  virtual void SettingsChanged() = 0;
  // Shows a line in the status bar.
  virtual void Report(const std::string& text) = 0;
};

}  // namespace fotomill::desktop
