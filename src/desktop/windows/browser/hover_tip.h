#pragma once

#include <wx/timer.h>

#include <string>

#include "core/status.h"
#include "desktop/models/browser/folder_listing.h"
#include "desktop/windows/widgets/loose_work.h"

class wxWindow;

namespace fotomill::desktop {

// The tooltip of the file below the pointer, after FileTipDelay; read in the background.
class HoverTip : public wxEvtHandler {
 public:
  explicit HoverTip(wxWindow& window);
  // The pointer is over an item of a folder, or null. `known` as in FileTipLines.
  void Over(const std::string& folder, const FolderItem* item, Status known);

 private:
  void Read();
  void OnActivate(wxActivateEvent& event);

  wxWindow& window_;
  wxTimer wait_;
  std::string folder_;
  FolderItem item_;  // empty name: none
  Status known_ = Status::Ok;
  bool listens_ = false;  // to the activation of its frame
  LooseWork reading_;
};

}  // namespace fotomill::desktop
