#include "desktop/windows/folder_tree.h"

#include <wx/imaglist.h>

#include <algorithm>
#include <memory>
#include <vector>

#include "desktop/natural_order.h"
#include "desktop/windows/bitmaps.h"
#include "desktop/windows/wx_text.h"
#include "platform/files.h"
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
  Bind(wxEVT_TREE_ITEM_EXPANDING, [this](wxTreeEvent& event) { Fill(event.GetItem()); });
  Bind(wxEVT_TREE_SEL_CHANGED, [this](wxTreeEvent& event) {
    const std::string folder = FolderOf(event.GetItem());
    if (!following_ && !folder.empty()) chosen_(folder);
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
  DeleteChildren(item);
  std::vector<std::string> names;
  for (const platform::FolderEntry& entry : platform::ListFolder(data->folder).value_or(std::vector<platform::FolderEntry>())) {
    if (entry.kind == platform::FileKind::Folder && !entry.name.starts_with('.')) names.push_back(entry.name);
  }
  std::sort(names.begin(), names.end(), [](const auto& a, const auto& b) { return CompareNatural(a, b) < 0; });
  for (const std::string& name : names) {
    const wxTreeItemId child = AppendItem(item, Shown(name), 0, -1, new FolderData(platform::JoinFolder(data->folder, name)));
    SetItemHasChildren(child);
  }
  if (names.empty()) SetItemHasChildren(item, false);
}

wxTreeItemId FolderTree::FindChild(const wxTreeItemId& item, const std::string& folder) {
  wxTreeItemIdValue cookie;
  for (wxTreeItemId child = GetFirstChild(item, cookie); child.IsOk(); child = GetNextChild(item, cookie)) {
    if (FolderOf(child) == folder) return child;
  }
  return {};
}

void FolderTree::Follow(const std::string& folder) {
  if (FolderOf(GetSelection()) == folder) return;
  // From the place that is nearest above the folder, down.
  wxTreeItemId item;
  wxTreeItemIdValue cookie;
  const auto isAbove = [&](const std::string& place) {
    const std::string begin = place.ends_with(platform::kSeparator) ? place : place + platform::kSeparator;
    return folder == place || folder.starts_with(begin);
  };
  for (wxTreeItemId place = GetFirstChild(GetRootItem(), cookie); place.IsOk(); place = GetNextChild(GetRootItem(), cookie)) {
    if (isAbove(FolderOf(place)) && (!item.IsOk() || FolderOf(place).size() > FolderOf(item).size())) item = place;
  }
  if (!item.IsOk()) return;
  following_ = true;
  while (FolderOf(item) != folder) {
    Fill(item);
    const size_t from = FolderOf(item).size() + (FolderOf(item).ends_with(platform::kSeparator) ? 0 : 1);
    const wxTreeItemId child = FindChild(item, folder.substr(0, folder.find(platform::kSeparator, from)));
    if (!child.IsOk()) break;
    Expand(item);
    item = child;
  }
  SelectItem(item);
  EnsureVisible(item);
  following_ = false;
}

}  // namespace fotomill::desktop
