#pragma once

#include <wx/treectrl.h>

#include <functional>
#include <string>

namespace fotomill::desktop {

// The folders at the left of the frame: home, pictures and the root of the file system. Folders are read when they open.
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
  wxTreeItemId FindChild(const wxTreeItemId& item, const std::string& name);

  const std::function<void(const std::string&)> chosen_;
  bool following_ = false;
};

}  // namespace fotomill::desktop
