#pragma once

#include <string>

#include "desktop/models/shell/favourites.h"

class wxSplitterWindow;
class wxWindow;

namespace fotomill::desktop {

class FolderTree;
class Shell;

// The left side of the frame: the folder tree with the favourites at its top, which can be hidden
// and resized.
class FolderPane {
 public:
  explicit FolderPane(Shell& shell);

  // The parent of what is beside the folders.
  wxWindow* Parent() const;
  void PlaceBeside(wxWindow& other);
  void Show(bool show);
  bool Shown() const;
  // Takes down the width in RememberNavPaneHPosition.
  void KeepWidth();

  // Marks a folder, as deep as the tree has to open for that.
  void Follow(const std::string& folder);
  // Favourites, volumes or folders may have come or gone.
  void UpdatePlaces();
  void Reread();  // folders may have come or gone below those that are open
  // Favorites go with their folder.
  void FollowRename(const std::string& from, const std::string& to);

  bool IsFavourite(const std::string& folder) const { return favourites_.Has(folder); }
  // Puts the folder among the favourites, or takes it out.
  void ToggleFavourite(const std::string& folder);

 private:
  Shell& shell_;
  Favourites favourites_;
  wxSplitterWindow* splitter_ = nullptr;
  FolderTree* tree_ = nullptr;
  wxWindow* other_ = nullptr;
};

}  // namespace fotomill::desktop
