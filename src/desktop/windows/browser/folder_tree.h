#pragma once

#include <wx/treectrl.h>

#include <functional>
#include <memory>
#include <set>
#include <string>
#include <utility>
#include <vector>

#include "desktop/models/shell/favorites.h"

namespace fotomill::desktop {

// The folders at the left of the frame: the user's favorites, home, pictures, mounted volumes and
// the root of the file system. Folders are read when they open, on a thread of their own.
class FolderTree : public wxTreeCtrl {
 public:
  // What the user did in it.
  struct Events {
    std::function<void(const std::string& folder)> chosen;     // by the user, not by Follow
    std::function<void(const std::string& folder)> openInTab;  // a new one
    std::function<void(const std::string& folder)> newFolder;  // in that one
    std::function<void(const std::string& folder, const std::string& name)> rename;  // to that name
    std::function<void(const std::string& folder)> toggleFavorite;
  };
  // The favorites are the frame's; they outlive the tree.
  FolderTree(wxWindow* parent, const Favorites& favorites, Events events);

  // Shows the favorites and the volumes as they are now.
  void UpdatePlaces();
  // Reads the folders that are open again.
  void Reread();
  // Opens the way to a folder and marks it, without telling `chosen`.
  void Follow(const std::string& folder);
  // The folder of an item; empty for none.
  std::string FolderOf(const wxTreeItemId& item) const;
  // The folder shown at a point of the window; empty for none.
  std::string FolderAt(const wxPoint& point) const;

 private:
  void LoadImages();
  struct Place;
  std::vector<Place> Places() const;
  std::vector<wxTreeItemId> ChildrenOf(const wxTreeItemId& item) const;
  void Fill(const wxTreeItemId& item);
  void Read(std::vector<std::string> folders);
  void ShowNames(const std::string& folder, const std::vector<std::string>& names);
  void MergeNames(const wxTreeItemId& item, const std::string& folder,
                  const std::vector<std::string>& names);
  // Goes on along the way to the followed folder as far as folders have been read.
  void FollowOn();
  wxTreeItemId FindChild(const wxTreeItemId& item, const std::string& folder) const;
  // The place at the top from which the way to a folder goes, and the item furthest along it that
  // is there.
  wxTreeItemId NearestItem(const std::string& folder) const;
  void ShowMenu(const wxTreeItemId& item, const wxPoint& point);
  void AskForName(const std::string& folder);

  const Favorites& favorites_;
  const Events events_;
  std::string followed_;
  // folders that open once they have been read
  std::set<std::string> opening_;
  // what is marked was not chosen by the user
  bool following_ = false;
  // for threads that outlive the window
  const std::shared_ptr<bool> alive_ = std::make_shared<bool>(true);
};

}  // namespace fotomill::desktop
