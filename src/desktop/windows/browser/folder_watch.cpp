#include "desktop/windows/browser/folder_watch.h"

#include <wx/filename.h>
#include <wx/log.h>

#include "settings/settings.h"

namespace fotomill::desktop {

namespace {

constexpr int kGatherMs = 300;  // changes are collected for this long

}  // namespace

FolderWatch::FolderWatch(std::function<void()> changed)
    : changed_(std::move(changed)), gather_(this) {
  Bind(wxEVT_TIMER, [this](wxTimerEvent&) { changed_(); });
  Bind(wxEVT_FSWATCHER, [this](wxFileSystemWatcherEvent& event) {
    constexpr int kNoChange = wxFSW_EVENT_ACCESS | wxFSW_EVENT_WARNING | wxFSW_EVENT_ERROR;
    if ((event.GetChangeType() & kNoChange) == 0 && !gather_.IsRunning())
      gather_.StartOnce(kGatherMs);
  });
}

void FolderWatch::Watch(const std::string& folder) {
  if (folder == folder_) return;
  folder_ = folder;
  watcher_.reset();
  if (settings.WatchFolders == 0 || folder.empty()) return;
  const wxLogNull quiet;
  watcher_ = std::make_unique<wxFileSystemWatcher>();
  watcher_->SetOwner(this);
  watcher_->Add(wxFileName::DirName(wxString::FromUTF8(folder)));
}

}  // namespace fotomill::desktop
