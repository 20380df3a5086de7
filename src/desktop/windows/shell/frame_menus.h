#pragma once

#include <wx/gdicmn.h>

class wxUpdateUIEvent;
class wxWindow;

namespace fotomill::desktop {

class Shell;

// The menu bar, the keys, and the context menu of files, from the rows of commands.cpp.
class FrameMenus {
 public:
  explicit FrameMenus(Shell& shell);

  // Shows the menu of the selected files at a place of `window`, with the programs that open them.
  void ShowContextMenu(wxWindow& window, const wxPoint& place);

 private:
  void BuildBar();
  void BindSecondKeys();
  void BindCommands();
  void Update(wxUpdateUIEvent& event);

  Shell& shell_;
};

}  // namespace fotomill::desktop
