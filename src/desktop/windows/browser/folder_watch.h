#pragma once

#include <wx/fswatcher.h>
#include <wx/timer.h>

#include <functional>
#include <memory>
#include <string>

namespace fotomill::desktop {

// Watches a folder for changes; reports several changes at once.
class FolderWatch : public wxEvtHandler {
 public:
  explicit FolderWatch(std::function<void()> changed);
  // Watches another folder, unless WatchFolders is off; empty: none. Works only while the event
  // loop runs.
  void Watch(const std::string& folder);

 private:
  const std::function<void()> changed_;
  std::string folder_;
  std::unique_ptr<wxFileSystemWatcher> watcher_;
  wxTimer gather_;
};

}  // namespace fotomill::desktop
