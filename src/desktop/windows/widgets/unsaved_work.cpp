#include "desktop/windows/widgets/unsaved_work.h"

#include <wx/toplevel.h>

#include <vector>

namespace fotomill::desktop {

bool CloseWorkWindows() {
  std::vector<wxWindow*> open;  // closing changes the list of windows
  for (wxWindow* window : wxTopLevelWindows) {
    if (dynamic_cast<HoldsWork*>(window) != nullptr && !window->IsBeingDeleted())
      open.push_back(window);
  }
  for (wxWindow* window : open) {
    if (!window->Close()) return false;
  }
  return true;
}

}  // namespace fotomill::desktop
