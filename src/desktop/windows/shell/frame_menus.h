#pragma once

#include <wx/gdicmn.h>

#include <string>
#include <vector>

class wxMenu;
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
  // Reads the list of recent files again; it is a menu below Open.
  void UpdateRecentFiles();

 private:
  void BuildBar();
  void BindSecondKeys();
  void BindCommands();
  void AddRecentFiles();
  void Update(wxUpdateUIEvent& event);

  Shell& shell_;
  wxMenu* recent_ = nullptr;
  std::vector<std::string> recentFiles_;  // in the order of its items
};

}  // namespace fotomill::desktop
