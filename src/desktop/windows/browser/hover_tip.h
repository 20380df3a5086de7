#pragma once

#include <wx/timer.h>

#include <string>

#include "core/status.h"
#include "desktop/models/browser/folder_listing.h"
#include "desktop/windows/widgets/loose_work.h"

class wxWindow;

namespace fotomill::desktop {

// The tip of the file below the pointer, after FileTipDelay; what it tells is read apart.
class HoverTip : public wxEvtHandler {
 public:
  explicit HoverTip(wxWindow& window);
  // The pointer is over an item of a folder, or over none. `known` as in FileTipLines.
  void Over(const std::string& folder, const FolderItem* item, Status known);

 private:
  void Read();

  wxWindow& window_;
  wxTimer wait_;
  std::string folder_;
  FolderItem item_;  // without a name: none
  Status known_ = Status::Ok;
  LooseWork reading_;
};

}  // namespace fotomill::desktop
