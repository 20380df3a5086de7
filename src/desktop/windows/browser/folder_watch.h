#pragma once

#include <wx/fswatcher.h>
#include <wx/timer.h>

#include <functional>
#include <memory>
#include <set>
#include <string>
#include <vector>

#include "desktop/models/browser/reread_pace.h"

namespace fotomill::desktop {

// Watches folders for changes; reports several changes at once, and those of a folder that keeps
// changing less often. Works only while the event loop runs, and unless WatchFolders is off.
class FolderWatch : public wxEvtHandler {
 public:
  // `changed` gets the watched folders that have changed, to be read again. `kinds` are flags
  // of wxFSW_EVENT.
  FolderWatch(int kinds, std::function<void(std::vector<std::string> folders)> changed);
  // Watches one more folder, up to a limit.
  void Watch(const std::string& folder);
  // No longer watches a folder and those in it.
  void Unwatch(const std::string& folder);
  void UnwatchAll();
  // Call when reading folders begins and ends.
  void ReadingBegan();
  void ReadingEnded();

 private:
  void OnChange(wxFileSystemWatcherEvent& event);
  void Report();

  const int kinds_;
  const std::function<void(std::vector<std::string> folders)> changed_;
  std::unique_ptr<wxFileSystemWatcher> watcher_;  // created when the event loop runs
  std::set<std::string> watched_, news_;
  RereadPace pace_;
  wxTimer gather_;
};

}  // namespace fotomill::desktop
