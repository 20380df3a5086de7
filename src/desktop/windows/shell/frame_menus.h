#pragma once

#include <wx/gdicmn.h>

#include <string>
#include <vector>

class wxMenu;
class wxUpdateUIEvent;
class wxWindow;

namespace fotomill::desktop {

class Shell;

// The menu bar, keys, and context menu of files, created from the rows of commands.cpp.
class FrameMenus {
 public:
  explicit FrameMenus(Shell& shell);

  // Shows the context menu of the selected files at a position in `window`, including "Open with".
  void ShowContextMenu(wxWindow& window, const wxPoint& place);
  // Shows the menu of the folder, for empty space of a list.
  void ShowFolderMenu(wxWindow& window, const wxPoint& place);
  // Reloads the submenu of recent files.
  void UpdateRecentFiles();
  // Call after the user's keys have changed.
  void UpdateKeys();

 private:
  void BuildBar();
  void BindSecondKeys();
  void BindCommands();
  void AddRecentFiles();
  void AddFunctions();  // those that are not rows of commands.cpp
  void AddRecipes(wxMenu& functions);
  void ListRecipesInMenu();
  void Update(wxUpdateUIEvent& event);

  Shell& shell_;
  wxMenu* recent_ = nullptr;
  std::vector<std::string> recentFiles_;  // in menu order
  wxMenu* recipes_ = nullptr;
  std::vector<std::string> recipeNames_;  // in menu order
};

}  // namespace fotomill::desktop
