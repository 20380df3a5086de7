#include "desktop/windows/browser/folder_watch.h"

#include <wx/filename.h>
#include <wx/log.h>

#include <cmath>
#include <utility>

#include "desktop/models/shell/favorites.h"
#include "desktop/windows/widgets/wx_text.h"
#include "platform/clock.h"
#include "settings/settings.h"

namespace fotomill::desktop {

namespace {

constexpr size_t kMostWatched = 256;

int Milliseconds(double seconds) { return static_cast<int>(std::lround(seconds * 1000)); }

wxFileName NameOf(const std::string& folder) {
  return wxFileName::DirName(wxString::FromUTF8(folder));
}

}  // namespace

FolderWatch::FolderWatch(int kinds, std::function<void(std::vector<std::string> folders)> changed)
    : kinds_(kinds), changed_(std::move(changed)), gather_(this) {
  Bind(wxEVT_TIMER, [this](wxTimerEvent&) { Report(); });
  Bind(wxEVT_FSWATCHER, &FolderWatch::OnChange, this);
}

void FolderWatch::Watch(const std::string& folder) {
  if (settings.WatchFolders == 0 || watched_.size() >= kMostWatched || watched_.contains(folder))
    return;
  const wxLogNull quiet;
  if (watcher_ == nullptr) {
    watcher_ = std::make_unique<wxFileSystemWatcher>();
    watcher_->SetOwner(this);
  }
  if (watcher_->Add(NameOf(folder), kinds_)) watched_.insert(folder);
}

void FolderWatch::Unwatch(const std::string& folder) {
  const auto gone = [&](const std::string& watched) { return LiesIn(watched, folder); };
  const wxLogNull quiet;
  for (const std::string& watched : watched_) {
    if (gone(watched)) (void)watcher_->Remove(NameOf(watched));
  }
  std::erase_if(watched_, gone);
  std::erase_if(news_, gone);
}

void FolderWatch::UnwatchAll() {
  watcher_.reset();
  watched_.clear();
  news_.clear();
}

void FolderWatch::ReadingBegan() { pace_.Began(platform::MonotonicSeconds()); }

void FolderWatch::ReadingEnded() { pace_.Ended(platform::MonotonicSeconds()); }

void FolderWatch::OnChange(wxFileSystemWatcherEvent& event) {
  // When there were too many changes, the system does not say which.
  const bool any = event.GetWarningType() == wxFSW_WARNING_OVERFLOW;
  if (!any && (event.GetChangeType() & kinds_) == 0) return;
  if (any || watched_.size() == 1) news_ = watched_;
  for (const wxFileName& name : {event.GetPath(), event.GetNewPath()}) {
    std::string folder = Utf8(name.GetPath());
    if (watched_.contains(folder)) news_.insert(std::move(folder));
  }
  if (!news_.empty() && !gather_.IsRunning())
    gather_.StartOnce(Milliseconds(pace_.DelayAt(platform::MonotonicSeconds())));
}

// A reading in progress is not started over: it might never end.
void FolderWatch::Report() {
  if (news_.empty()) return;
  if (pace_.Reading()) {
    gather_.StartOnce(Milliseconds(RereadPace::kSoon));
    return;
  }
  const std::set<std::string> news = std::exchange(news_, {});
  changed_({news.begin(), news.end()});
}

}  // namespace fotomill::desktop
