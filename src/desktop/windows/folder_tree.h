#pragma once

#include <wx/treectrl.h>

#include <functional>
#include <memory>
#include <set>
#include <string>
#include <vector>

namespace fotomill::desktop {

// The folders at the left of the frame: home, pictures and the root of the file system. Folders are read when they open, on
// a thread of their own.
class FolderTree : public wxTreeCtrl {
 public:
  FolderTree(wxWindow* parent, std::function<void(const std::string&)> chosen);

  // Opens the way to a folder and marks it, without telling `chosen`.
  void Follow(const std::string& folder);
  // The folder of an item; empty for none.
  std::string FolderOf(const wxTreeItemId& item) const;
  std::string FolderAt(const wxPoint& point) const;

 private:
  wxTreeItemId AddPlace(const wxString& label, const std::string& folder);
  void Fill(const wxTreeItemId& item);
  void TakeNames(const std::string& folder, const std::vector<std::string>& names);
  // Goes on along the way to the followed folder as far as folders have been read.
  void FollowOn();
  wxTreeItemId FindChild(const wxTreeItemId& item, const std::string& folder) const;
  // The place at the top from which the way to a folder goes, and the item furthest along it that is there.
  wxTreeItemId NearestItem(const std::string& folder) const;

  const std::function<void(const std::string&)> chosen_;
  std::string followed_;
  std::set<std::string> opening_;  // folders that open once they have been read
  bool following_ = false;
  const std::shared_ptr<bool> alive_ = std::make_shared<bool>(true);  // for threads that outlive the window
};

}  // namespace fotomill::desktop
