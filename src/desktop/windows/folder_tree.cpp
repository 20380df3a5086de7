#include "desktop/windows/folder_tree.h"

#include <wx/app.h>

#include <thread>

#include "desktop/folder_listing.h"
#include "desktop/windows/bitmaps.h"
#include "desktop/windows/wx_text.h"
#include "platform/folders.h"
#include "platform/paths.h"

namespace fotomill::desktop {

namespace {

struct FolderData : wxTreeItemData {
  explicit FolderData(std::string path) : folder(std::move(path)) {}
  std::string folder;
  bool filled = false;
};

}  // namespace

FolderTree::FolderTree(wxWindow* parent, std::function<void(const std::string&)> chosen)
    : wxTreeCtrl(parent, wxID_ANY, wxDefaultPosition, wxDefaultSize,
                 wxTR_HAS_BUTTONS | wxTR_HIDE_ROOT | wxTR_LINES_AT_ROOT | wxTR_NO_LINES | wxTR_FULL_ROW_HIGHLIGHT | wxBORDER_NONE,
                 wxDefaultValidator, "Folders"),
      chosen_(std::move(chosen)) {
  wxVector<wxBitmapBundle> images;
  images.push_back(Symbol("folder"));
  images.push_back(Symbol("home"));
  SetImages(images);
  AddRoot("");
  const std::string home = platform::SpecialFolderPath(platform::SpecialFolder::Home);
  const std::string pictures = platform::SpecialFolderPath(platform::SpecialFolder::Pictures);
  if (!home.empty()) SetItemImage(AddPlace("Home", home), 1);
  if (!pictures.empty() && pictures != home) AddPlace("Pictures", pictures);
  AddPlace("File system", std::string(1, platform::kSeparator));
  // What is not read yet opens when it has been.
  Bind(wxEVT_TREE_ITEM_EXPANDING, [this](wxTreeEvent& event) {
    if (GetChildrenCount(event.GetItem(), false) > 0) return;
    opening_.insert(FolderOf(event.GetItem()));
    Fill(event.GetItem());
    event.Veto();
  });
  Bind(wxEVT_TREE_SEL_CHANGED, [this](wxTreeEvent& event) {
    const std::string folder = FolderOf(event.GetItem());
    if (following_ || folder.empty()) return;
    followed_ = folder;
    chosen_(folder);
  });
}

wxTreeItemId FolderTree::AddPlace(const wxString& label, const std::string& folder) {
  const wxTreeItemId item = AppendItem(GetRootItem(), label, 0, -1, new FolderData(folder));
  SetItemHasChildren(item);
  return item;
}

std::string FolderTree::FolderOf(const wxTreeItemId& item) const {
  const auto* data = item.IsOk() ? static_cast<FolderData*>(GetItemData(item)) : nullptr;
  return data == nullptr ? std::string() : data->folder;
}

std::string FolderTree::FolderAt(const wxPoint& point) const {
  int flags = 0;
  return FolderOf(const_cast<FolderTree*>(this)->HitTest(point, flags));
}

void FolderTree::Fill(const wxTreeItemId& item) {
  auto* data = static_cast<FolderData*>(GetItemData(item));
  if (data == nullptr || data->filled) return;
  data->filled = true;
  const std::weak_ptr<bool> alive = alive_;
  std::thread([this, alive, folder = data->folder] {
    std::vector<std::string> names = SubfolderNames(folder);
    wxTheApp->CallAfter([this, alive, folder, names = std::move(names)] {
      if (!alive.expired()) TakeNames(folder, names);
    });
  }).detach();
}

void FolderTree::TakeNames(const std::string& folder, const std::vector<std::string>& names) {
  // A folder may hang in the tree twice: under a place of its own and under the file system.
  wxTreeItemIdValue cookie;
  for (wxTreeItemId place = GetFirstChild(GetRootItem(), cookie); place.IsOk(); place = GetNextChild(GetRootItem(), cookie)) {
    wxTreeItemId item = place;
    while (item.IsOk() && FolderOf(item) != folder) item = FindChild(item, folder);
    if (!item.IsOk() || !static_cast<FolderData*>(GetItemData(item))->filled || GetChildrenCount(item, false) > 0) continue;
    for (const std::string& name : names) {
      const wxTreeItemId child = AppendItem(item, Shown(name), 0, -1, new FolderData(platform::JoinFolder(folder, name)));
      SetItemHasChildren(child);
    }
    SetItemHasChildren(item, !names.empty());
    if (opening_.erase(folder) > 0 && !names.empty()) Expand(item);
  }
  FollowOn();
}

// Whether a folder is `above` or lies below it.
static bool LiesIn(const std::string& folder, const std::string& above) {
  return folder == above || (!above.empty() && folder.starts_with(platform::JoinFolder(above, "")));
}

wxTreeItemId FolderTree::FindChild(const wxTreeItemId& item, const std::string& folder) const {
  wxTreeItemIdValue cookie;
  for (wxTreeItemId child = GetFirstChild(item, cookie); child.IsOk(); child = GetNextChild(item, cookie)) {
    if (LiesIn(folder, FolderOf(child))) return child;
  }
  return {};
}

wxTreeItemId FolderTree::NearestItem(const std::string& folder) const {
  wxTreeItemId item;
  wxTreeItemIdValue cookie;
  for (wxTreeItemId place = GetFirstChild(GetRootItem(), cookie); place.IsOk(); place = GetNextChild(GetRootItem(), cookie)) {
    if (LiesIn(folder, FolderOf(place)) && (!item.IsOk() || FolderOf(place).size() > FolderOf(item).size())) item = place;
  }
  while (item.IsOk() && FolderOf(item) != folder) {
    const wxTreeItemId child = FindChild(item, folder);
    if (!child.IsOk()) break;
    item = child;
  }
  return item;
}

void FolderTree::Follow(const std::string& folder) {
  if (followed_ == folder) return;
  followed_ = folder;
  FollowOn();
}

void FolderTree::FollowOn() {
  const wxTreeItemId item = NearestItem(followed_);
  if (!item.IsOk()) return;
  following_ = true;
  if (FolderOf(item) == followed_) {
    if (GetSelection() != item) SelectItem(item);
    EnsureVisible(item);
  } else {
    Fill(item);
  }
  following_ = false;
}

}  // namespace fotomill::desktop
