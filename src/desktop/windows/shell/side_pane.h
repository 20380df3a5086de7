#pragma once

#include <wx/timer.h>

#include <string>

#include "desktop/models/browser/folder_listing.h"
#include "desktop/windows/widgets/loose_work.h"

class wxSplitterWindow;
class wxWindow;

namespace fotomill::desktop {

class BrowserModel;
class Shell;
class SideView;

// The right side of the frame: preview and facts of the focused file. Can be hidden and resized;
// SidePaneEnable and SidePaneWidth keep that.
class SidePane {
 public:
  SidePane(Shell& shell, wxWindow* parent);  // must outlive this object

  // The parent for the browsers; contains the pane as well.
  wxWindow* Parent() const;
  void PlaceBeside(wxWindow& browsers);  // on their right
  void Show(bool show);
  bool Shown() const;
  void KeepWidth();  // for the next start

  // Shows the focused line of a browser; call whenever it may have changed. Costs nothing if it
  // has not.
  void Follow(const BrowserModel& model);

 private:
  void ShowItem();
  void Read();

  Shell& shell_;
  wxSplitterWindow* splitter_ = nullptr;
  SideView* view_ = nullptr;
  wxWindow* browsers_ = nullptr;
  int width_ = 0;  // of the pane, device-independent pixels
  std::string folder_;
  FolderItem item_;  // empty name: none
  wxTimer wait_;
  LooseWork reading_;
};

}  // namespace fotomill::desktop
