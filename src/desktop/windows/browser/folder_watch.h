#pragma once

#include <wx/fswatcher.h>
#include <wx/timer.h>

#include <functional>
#include <memory>
#include <string>

namespace fotomill::desktop {

// Tells of changes in one folder, many at once as one.
class FolderWatch : public wxEvtHandler {
 public:
  explicit FolderWatch(std::function<void()> changed);
  // Watches a folder from here on, unless WatchFolders is off; an empty name watches nothing. Only
  // works once the program waits for events.
  void Watch(const std::string& folder);

 private:
  const std::function<void()> changed_;
  std::string folder_;
  std::unique_ptr<wxFileSystemWatcher> watcher_;
  wxTimer gather_;
};

}  // namespace fotomill::desktop
