#pragma once

#include <string>

#include "desktop/models/shell/favorites.h"

class wxSplitterWindow;
class wxWindow;

namespace fotomill::desktop {

class FolderTree;
class Shell;

// The left side of the frame: the folder tree with the favorites at the top. Can be hidden and
// resized.
class FolderPane {
 public:
  explicit FolderPane(Shell& shell);  // must outlive this object

  // The parent for the window beside the folders.
  wxWindow* Parent() const;
  void PlaceBeside(wxWindow& other);  // on the right; a child of Parent
  void Show(bool show);               // remembers the width when hidden
  bool Shown() const;
  // Saves the width in RememberNavPaneHPosition.
  void KeepWidth();

  // Selects a folder, expanding the tree to it.
  void Follow(const std::string& folder);
  // Call after changes of favorites or volumes.
  void UpdatePlaces();
  void Reread();  // call after changes of expanded folders
  // Updates favorites after a folder was renamed.
  void FollowRename(const std::string& from, const std::string& to);

  // Whether this folder itself is a favorite.
  bool IsFavorite(const std::string& folder) const { return favorites_.Has(folder); }
  // Adds a folder to the favorites, or removes it.
  void ToggleFavorite(const std::string& folder);

 private:
  Shell& shell_;
  Favorites favorites_;
  wxSplitterWindow* splitter_ = nullptr;
  FolderTree* tree_ = nullptr;
  wxWindow* other_ = nullptr;
};

}  // namespace fotomill::desktop
