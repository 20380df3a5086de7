#pragma once

#include <wx/timer.h>
#include <wx/treectrl.h>

#include <functional>
#include <memory>
#include <set>
#include <string>
#include <utility>
#include <vector>

#include "desktop/models/shell/favorites.h"
#include "desktop/windows/browser/folder_watch.h"

namespace fotomill::desktop {

// The folder tree of the frame: the user's favorites, home, pictures, mounted volumes and the root
// of the file system. Folders are read when expanded, on separate threads.
class FolderTree : public wxTreeCtrl {
 public:
  // User actions.
  struct Events {
    std::function<void(const std::string& folder)> chosen;     // not by Follow
    std::function<void(const std::string& folder)> openInTab;  // in a new tab
    std::function<void(const std::string& folder)> newFolder;  // inside that folder
    std::function<void(const std::string& folder, const std::string& name)> rename;  // to `name`
    std::function<void(const std::string& folder)> toggleFavorite;
  };
  // `favorites` belong to the frame and must outlive the tree.
  FolderTree(wxWindow* parent, const Favorites& favorites, Events events);

  // Updates favorites and volumes.
  void UpdatePlaces();
  // Reads all expanded folders again.
  void Reread();
  // Expands the tree to a folder and selects it, without calling `chosen`.
  void Follow(const std::string& folder);
  // The folder of an item; empty if invalid.
  std::string FolderOf(const wxTreeItemId& item) const;
  // Marks the item at a point of the window as the place of a drop, and opens it after a while.
  // Null: none.
  void MarkDrop(const wxPoint* point);
  // The folder at a point of the window; empty if there is none.
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
  void BeginDrag(const wxTreeItemId& item);
  // Expands further toward the followed folder, as far as folders have been read.
  void FollowOn();
  wxTreeItemId FindChild(const wxTreeItemId& item, const std::string& folder) const;
  // The item closest to a folder, starting at
  // the top-level folder that contains it.
  wxTreeItemId NearestItem(const std::string& folder) const;
  void ShowMenu(const wxTreeItemId& item, const wxPoint& point);
  void AskForName(const std::string& folder);

  const Favorites& favorites_;
  const Events events_;
  std::string followed_;
  // folders to expand after reading
  std::set<std::string> opening_;
  // the selection was changed by Follow, not by the user
  bool following_ = false;
  FolderWatch watch_;  // folders read so far, for those made or removed by others
  wxTreeItemId drop_;  // marked item
  wxTimer openTimer_;  // until the marked item is opened
  // for threads that outlive the window
  const std::shared_ptr<bool> alive_ = std::make_shared<bool>(true);
};

}  // namespace fotomill::desktop
