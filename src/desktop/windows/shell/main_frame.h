#pragma once

#include <wx/frame.h>
#include <wx/timer.h>

#include <functional>
#include <memory>
#include <string>
#include <vector>

#include "core/workers/background_task.h"
#include "desktop/windows/browser/thumbnail_service.h"
#include "desktop/windows/shell/shell.h"
#include "desktop/windows/widgets/file_question.h"
#include "platform/files.h"

namespace fotomill::desktop {

class FrameMenus;

// The main window: creates its parts, and forwards global changes to them.
class MainFrame : public wxFrame, public Shell {
 public:
  MainFrame();
  ~MainFrame() override;

  // Shows the folder or file the program was started with. A file is shown immediately, and its
  // folder listed afterwards; with `restore`, also opens the tabs of the last session. Empty: the
  // tabs of the last session, or a folder.
  void OpenStart(const std::string& path, bool restore);

  // Shell
  wxFrame& Window() override { return *this; }
  BrowserTabs& Tabs() override { return *tabs_; }
  FolderPane& Folders() override { return *folders_; }
  SidePane& Side() override { return *side_; }
  PictureWindows& Pictures() override { return *pictures_; }
  FileActions& Files() override { return *files_; }
  BatchRunner& Batches() override { return *batches_; }
  ThumbnailService& Thumbnails() override { return thumbnails_; }
  UseRecorder& Uses() override { return *uses_; }
  ExternalPrograms& Programs() override { return *programs_; }
  FrameSession& Session() override { return *session_; }
  FunctionToolbar& Toolbar() override { return *toolbar_; }
  void OpenPath(const std::string& path) override;
  void FilesChanged() override;
  void FollowRename(const std::string& from, const std::string& to) override;
  void SettingsChanged() override;
  void Report(const std::string& text) override;

 private:
  void BrowserChanged();
  void ShowCount();
  void AskKind(const std::string& path, std::function<void(platform::FileKind)> then);
  void Open(const std::string& path, platform::FileKind kind, bool restore);
  void ShowStartFolder(std::string folder, bool restore);
  void NoteRecentFile(const std::string& path);
  void OnClose(wxCloseEvent& event);
  void PurgeThumbnailsLater();

  wxString count_;  // of the status bar
  wxTimer messageTimer_;
  ThumbnailService thumbnails_;
  std::unique_ptr<UseRecorder> uses_;
  std::unique_ptr<FrameMenus> menus_;
  std::unique_ptr<FunctionToolbar> toolbar_;
  std::unique_ptr<FolderPane> folders_;
  std::unique_ptr<SidePane> side_;
  std::unique_ptr<BrowserTabs> tabs_;
  std::unique_ptr<FrameSession> session_;
  std::unique_ptr<PictureWindows> pictures_;
  std::unique_ptr<ExternalPrograms> programs_;
  std::unique_ptr<FileActions> files_;
  std::unique_ptr<BatchRunner> batches_;
  std::vector<std::unique_ptr<FileQuestion>> questions_;
  wxTimer purgeTimer_;    // until the start is over
  BackgroundTask purge_;  // of the thumbnails of vanished pictures
};

}  // namespace fotomill::desktop
