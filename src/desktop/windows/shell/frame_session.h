#pragma once

#include "desktop/models/shell/session.h"

namespace fotomill::desktop {

class Shell;

// What comes back at the next start: the frame's size and its tabs. Tabs can also be kept as sets
// with names of their own.
class FrameSession {
 public:
  explicit FrameSession(Shell& shell) : shell_(shell) {}

  // Gives the frame the size and place of the last run; its tabs are opened later.
  void RestorePlace();
  // Opens the tabs of the last run, where they are to be remembered. False if there are none.
  bool RestoreTabs();
  // Writes the tabs, or none, and the frame's size to the set in use. False when that could not be
  // done.
  [[nodiscard]] bool Keep(bool withTabs);

  // Ask for a name; the tabs are kept under it from then on.
  void SaveTabSet();
  // Asks for a set, whose tabs take the place of those that are open.
  void OpenTabSet();

 private:
  Shell& shell_;
  Session lastTabs_;  // of the last run, as long as they are not open
};

}  // namespace fotomill::desktop
