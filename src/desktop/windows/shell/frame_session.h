#pragma once

#include "desktop/models/shell/session.h"

namespace fotomill::desktop {

class Shell;

// Saves and restores the frame's size and
// tabs. Tabs can also be saved as named sets.
class FrameSession {
 public:
  explicit FrameSession(Shell& shell) : shell_(shell) {}

  // Restores the frame's size and position of the last run; its tabs are opened later.
  void RestorePlace();
  // Opens the tabs of the last run, if enabled. False if there are none.
  bool RestoreTabs();
  // Saves the tabs, or none, and the frame's size
  // to the current set. False if that failed.
  [[nodiscard]] bool Keep(bool withTabs);

  // Asks for a name; the tabs are saved under it from then on.
  void SaveTabSet();
  // Asks for a set and replaces the open tabs with it.
  void OpenTabSet();

 private:
  Shell& shell_;
  Session lastTabs_;  // of the last run, until opened
};

}  // namespace fotomill::desktop
