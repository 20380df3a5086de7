#include "desktop/windows/shell/main_frame.h"

#include <wx/msgdlg.h>

#include <algorithm>
#include <vector>

#include "batch/external_program.h"
#include "catalog/thumbnails/database_upkeep.h"
#include "catalog/thumbnails/thumbnail_database.h"
#include "desktop/models/shell/event_log.h"
#include "desktop/windows/batch/batch_runner.h"
#include "desktop/windows/files/file_actions.h"
#include "desktop/windows/files/open_with.h"
#include "desktop/windows/history/use_recorder.h"
#include "desktop/windows/shell/browser_tabs.h"
#include "desktop/windows/shell/folder_pane.h"
#include "desktop/windows/shell/frame_menus.h"
#include "desktop/windows/shell/frame_session.h"
#include "desktop/windows/shell/function_toolbar.h"
#include "desktop/windows/shell/picture_windows.h"
#include "desktop/windows/shell/side_pane.h"
#include "desktop/windows/view/screen_profile.h"
#include "desktop/windows/widgets/unsaved_work.h"
#include "desktop/windows/widgets/wx_text.h"
#include "platform/files.h"
#include "platform/folders.h"
#include "platform/paths.h"
#include "settings/configuration.h"
#include "settings/format_switches.h"
#include "settings/history_list.h"
#include "settings/settings.h"
#include "texts/texts.h"

namespace fotomill::desktop {

namespace {

constexpr const char* kTitle = "Fotomill Professional";
const wxSize kUsualSize(1180, 760), kLeastSize(400, 300);  // device-independent pixels
enum StatusField { kCountField, kMessageField, kFieldCount };
constexpr int kMessageMs = 8000;  // until a message goes away

}  // namespace

MainFrame::MainFrame()
    : wxFrame(nullptr, wxID_ANY, kTitle, wxDefaultPosition, FromDIP(kUsualSize, nullptr),
              wxDEFAULT_FRAME_STYLE, "FotomillProfessional") {
  SetMinSize(FromDIP(kLeastSize));
  uses_ = std::make_unique<UseRecorder>();
  programs_ = std::make_unique<ExternalPrograms>(*this);
  menus_ = std::make_unique<FrameMenus>(*this);
  toolbar_ = std::make_unique<FunctionToolbar>(*this);
  folders_ = std::make_unique<FolderPane>(*this);
  side_ = std::make_unique<SidePane>(*this, folders_->Parent());
  tabs_ = std::make_unique<BrowserTabs>(side_->Parent(), *this, *menus_,
                                        [this] { BrowserChanged(); });
  side_->PlaceBeside(tabs_->Window());
  folders_->PlaceBeside(*side_->Parent());
  messageTimer_.Bind(wxEVT_TIMER, [this](wxTimerEvent&) { Report({}); });
  session_ = std::make_unique<FrameSession>(*this);
  pictures_ = std::make_unique<PictureWindows>(*this);
  CreateStatusBar(kFieldCount);
  const int widths[] = {-2, -3};
  SetStatusWidths(kFieldCount, widths);
  SetStatusBarPane(kMessageField);
  GetStatusBar()->Bind(wxEVT_SIZE, [this](wxSizeEvent& event) {
    CallAfter([this] { ShowCount(); });
    event.Skip();
  });
  files_ = std::make_unique<FileActions>(*this);
  batches_ = std::make_unique<BatchRunner>(*this);
  Bind(wxEVT_DISPLAY_CHANGED, [](wxDisplayChangedEvent& event) {
    TakeScreenProfiles();
    event.Skip();
  });
  Bind(wxEVT_CLOSE_WINDOW, &MainFrame::OnClose, this);
  PurgeThumbnailsLater();
  // Volumes may have changed while the window was inactive.
  Bind(wxEVT_ACTIVATE, [this](wxActivateEvent& event) {
    if (event.GetActive()) folders_->UpdatePlaces();
    event.Skip();
  });
}

MainFrame::~MainFrame() {
  questions_.clear();
  // Their threads call back into this window and its children.
  batches_.reset();
  files_.reset();
  thumbnails_.SetListener(nullptr);
  // Child windows use its parts until the end, so destroy them first.
  DestroyChildren();
}

void MainFrame::PurgeThumbnailsLater() {
  constexpr int kDelay = 60'000;  // milliseconds, so that the start is not slowed down
  purgeTimer_.Bind(wxEVT_TIMER, [this](wxTimerEvent&) {
    const int32_t days = std::max(settings.ThumbnailCompactInterval, 1);
    const bool hidden = settings.WriteHiddenThumbnails != 0;
    purge_.Start(Lane::Blocking, [days, hidden](const StopToken& stop) {
      (void)PurgeDatabaseWhenDue(ThumbnailDatabasePath({}), days, hidden, stop);
      return Status::Ok;
    });
  });
  purgeTimer_.StartOnce(kDelay);
}

void MainFrame::ShowStartFolder(std::string folder, bool restore) {
  const bool restored = restore && session_->RestoreTabs();
  if (folder.empty() && (restored || tabs_->Front() != nullptr)) return;
  if (folder.empty() && settings.NewBrowserMyPictures != 0)
    folder = platform::SpecialFolderPath(platform::SpecialFolder::Pictures);
  tabs_->Show(folder.empty() ? platform::CurrentFolder() : folder);
}

void MainFrame::OpenStart(const std::string& path, bool restore) {
  if (path.empty()) return ShowStartFolder({}, restore);
  AskKind(path, [this, path, restore](platform::FileKind kind) { Open(path, kind, restore); });
}

// Asks what a path is; several questions may be pending.
void MainFrame::AskKind(const std::string& path, std::function<void(platform::FileKind)> then) {
  std::erase_if(questions_, [](const auto& question) { return !question->Pending(); });
  questions_.push_back(std::make_unique<FileQuestion>());
  questions_.back()->Ask<platform::FileKind>(
      [path] { return platform::FactsOf(path).kind; }, std::move(then),
      [this, path] { Report(Tr("Waiting for %1...", path)); }, platform::FileKind::Other);
}

void MainFrame::Open(const std::string& path, platform::FileKind kind, bool restore) {
  if (kind == platform::FileKind::Folder) return ShowStartFolder(path, restore);
  NoteRecentFile(path);
  const std::string folder = platform::AbsolutePath(path + "/..");
  if (NeedsExternalProgram(path)) {
    ShowStartFolder(folder, restore);
    return programs_->Open(path);
  }
  pictures_->ViewBeforeFolder(path, [this, restore, folder] { ShowStartFolder(folder, restore); });
}

void MainFrame::OpenPath(const std::string& path) {
  AskKind(path, [this, path](platform::FileKind kind) {
    if (kind == platform::FileKind::Missing) return Report(Tr("%1 no longer exists.", path));
    Open(path, kind, false);
  });
}

// Adds a file to the list of recent files, keeping the number of an entry from another version.
void MainFrame::NoteRecentFile(const std::string& path) {
  const std::vector<RecentFile> files = LoadRecentFiles();
  const auto known = std::ranges::find(files, path, &RecentFile::path);
  if (AddRecentFile({path, known == files.end() ? 0 : known->number})) menus_->UpdateRecentFiles();
}

void MainFrame::BrowserChanged() {
  const BrowserPage& browser = *tabs_->Front();
  const BrowserModel& model = browser.Model();
  const wxString title = FolderLabel(model.Folder()) + " - " + kTitle;
  if (GetTitle() != title) SetTitle(title);
  count_ = Shown(model.CountText());
  ShowCount();
  pictures_->OfferList(browser);
  folders_->Follow(model.Folder());
  side_->Follow(model);
}

// The status bar cannot draw before it has a size.
void MainFrame::ShowCount() {
  wxRect field;
  if (GetStatusBar()->GetFieldRect(kCountField, field) && field.width > 0)
    SetStatusText(count_, kCountField);
}

void MainFrame::FilesChanged() {
  folders_->Reread();
  tabs_->Reload();
  pictures_->FilesChanged();
}

void MainFrame::FollowRename(const std::string& from, const std::string& to) {
  folders_->FollowRename(from, to);
  tabs_->FollowRename(from, to);
  pictures_->FollowRename(from, to);
}

void MainFrame::SettingsChanged() {
  TakePluginOverride();
  files_->SettingsChanged();
  menus_->UpdateRecentFiles();
  menus_->UpdateKeys();
  thumbnails_.Clear();
  FilesChanged();
}

void MainFrame::Report(const std::string& text) {
  SetStatusText(Shown(text), kMessageField);
  LogEvent("status", text);
  if (!text.empty()) messageTimer_.StartOnce(kMessageMs);
}

void MainFrame::OnClose(wxCloseEvent& event) {
  if (event.CanVeto() && !CloseWorkWindows()) return event.Veto();
  if (batches_->Running() && event.CanVeto()) {
    wxMessageDialog dialog(this, Label("A batch is running. Stop it and quit?"), kTitle,
                           wxOK | wxCANCEL | wxICON_WARNING);
    dialog.SetOKCancelLabels(Label("&Stop and quit"), Label("&Continue"));
    if (dialog.ShowModal() != wxID_OK) return event.Veto();
  }
  folders_->KeepWidth();
  side_->KeepWidth();
  (void)session_->Keep(settings.RememberOpenWindows != 0);
  (void)SaveConfiguration();
  uses_->End();
  event.Skip();
}

}  // namespace fotomill::desktop
