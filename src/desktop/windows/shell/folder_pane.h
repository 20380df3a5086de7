#pragma once

#include <string>

#include "desktop/models/shell/favorites.h"

class wxSplitterWindow;
class wxWindow;

namespace fotomill::desktop {

class FolderTree;
class Shell;

// The left side of the frame: the folder tree with the favorites at its top, which can be hidden
// and resized.
class FolderPane {
 public:
  explicit FolderPane(Shell& shell);  // builds it into the frame; the shell outlives it

  // The parent of what is beside the folders.
  wxWindow* Parent() const;
  void PlaceBeside(wxWindow& other);  // what is at its right, a child of Parent
  void Show(bool show);               // keeps the width for the next time
  bool Shown() const;
  // Takes down the width in RememberNavPaneHPosition.
  void KeepWidth();

  // Marks a folder, as deep as the tree has to open for that.
  void Follow(const std::string& folder);
  // Favorites, volumes or folders may have come or gone.
  void UpdatePlaces();
  void Reread();  // folders may have come or gone below those that are open
  // Favorites go with their folder.
  void FollowRename(const std::string& from, const std::string& to);

  // That folder itself, not one below it.
  bool IsFavorite(const std::string& folder) const { return favorites_.Has(folder); }
  // Puts the folder among the favorites, or takes it out.
  void ToggleFavorite(const std::string& folder);

 private:
  Shell& shell_;
  Favorites favorites_;
  wxSplitterWindow* splitter_ = nullptr;
  FolderTree* tree_ = nullptr;
  wxWindow* other_ = nullptr;
};

}  // namespace fotomill::desktop
