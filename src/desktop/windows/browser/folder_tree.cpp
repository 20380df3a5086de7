#include "desktop/windows/browser/folder_tree.h"

#include <wx/app.h>
#include <wx/dnd.h>
#include <wx/menu.h>
#include <wx/textdlg.h>

#include <algorithm>

#include "core/workers/background_task.h"
#include "desktop/models/browser/folder_listing.h"
#include "desktop/models/shell/event_log.h"
#include "desktop/windows/files/file_list_data.h"
#include "desktop/windows/widgets/bitmaps.h"
#include "desktop/windows/widgets/wx_text.h"
#include "platform/folders.h"
#include "platform/paths.h"
#include "platform/volumes.h"

namespace fotomill::desktop {

namespace {

constexpr int kOpenMs = 900;  // dragging over a folder opens it

enum Image { kFolderImage, kHomeImage, kFavoriteImage, kVolumeImage };

struct FolderData : wxTreeItemData {
  explicit FolderData(std::string path) : folder(std::move(path)) {}
  std::string folder;
  bool filled = false;
};

}  // namespace

// A top-level folder of the tree.
struct FolderTree::Place {
  Image image;
  wxString label;
  std::string folder;
};

FolderTree::FolderTree(wxWindow* parent, const Favorites& favorites, Events events)
    : wxTreeCtrl(parent, wxID_ANY, wxDefaultPosition, wxDefaultSize,
                 wxTR_HAS_BUTTONS | wxTR_HIDE_ROOT | wxTR_LINES_AT_ROOT | wxTR_NO_LINES |
                     wxTR_FULL_ROW_HIGHLIGHT | wxBORDER_NONE,
                 wxDefaultValidator, Label("Folders")),
      favorites_(favorites),
      events_(std::move(events)),
      watch_(wxFSW_EVENT_CREATE | wxFSW_EVENT_DELETE | wxFSW_EVENT_RENAME,
             [this](std::vector<std::string> folders) {
               watch_.ReadingBegan();
               Read(std::move(folders));
             }) {
  LoadImages();
  Bind(wxEVT_SYS_COLOUR_CHANGED, [this](wxSysColourChangedEvent& event) {
    LoadImages();
    event.Skip();
  });
  AddRoot("");
  UpdatePlaces();
  // Folders not read yet are expanded after reading.
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
    events_.chosen(folder);
  });
  Bind(wxEVT_TREE_BEGIN_DRAG, [this](wxTreeEvent& event) { BeginDrag(event.GetItem()); });
  openTimer_.Bind(wxEVT_TIMER, [this](wxTimerEvent&) {
    if (drop_.IsOk()) Expand(drop_);
  });
  // The tree gets its size after it followed the first folder.
  Bind(wxEVT_SIZE, [this](wxSizeEvent& event) {
    event.Skip();
    CallAfter([this] {
      if (FolderOf(GetSelection()) == followed_ && !followed_.empty())
        EnsureVisible(GetSelection());
    });
  });
  Bind(wxEVT_TREE_ITEM_MENU,
       [this](wxTreeEvent& event) { ShowMenu(event.GetItem(), event.GetPoint()); });
}

// In the text color.
void FolderTree::LoadImages() {
  wxVector<wxBitmapBundle> images;
  for (const char* symbol : {"folder", "home", "favorite", "volume"})
    images.push_back(Symbol(symbol));
  SetImages(images);
}

// --- top-level folders ---

std::vector<FolderTree::Place> FolderTree::Places() const {
  std::vector<Place> places;
  for (const std::string& folder : favorites_.Folders()) {
    const std::string_view name = platform::FileNameOf(folder);
    places.push_back({kFavoriteImage, Shown(name.empty() ? folder : name), folder});
  }
  const std::string home = platform::SpecialFolderPath(platform::SpecialFolder::Home);
  const std::string pictures = platform::SpecialFolderPath(platform::SpecialFolder::Pictures);
  if (!home.empty()) places.push_back({kHomeImage, Label("Home"), home});
  if (!pictures.empty() && pictures != home)
    places.push_back({kFolderImage, Label("Pictures"), pictures});
  for (const std::string& folder : platform::UserVolumes()) {
    places.push_back({kVolumeImage, Shown(platform::FileNameOf(folder)), folder});
  }
  places.push_back({kFolderImage, Label("File system"), std::string(1, platform::kSeparator)});
  return places;
}

void FolderTree::UpdatePlaces() {
  following_ = true;
  const std::vector<Place> places = Places();
  const auto shows = [this](const wxTreeItemId& item, const Place& place) {
    return FolderOf(item) == place.folder && GetItemImage(item) == place.image;
  };
  for (const wxTreeItemId& item : ChildrenOf(GetRootItem())) {
    if (std::ranges::none_of(places, [&](const Place& place) { return shows(item, place); })) {
      MarkDrop(nullptr);
      Delete(item);
    }
  }
  size_t at = 0;
  for (const wxTreeItemId& item : ChildrenOf(GetRootItem())) {
    for (; at < places.size() && !shows(item, places[at]); ++at) {
      const wxTreeItemId added = InsertItem(GetRootItem(), at, places[at].label, places[at].image,
                                            -1, new FolderData(places[at].folder));
      SetItemHasChildren(added);
    }
    ++at;
  }
  for (; at < places.size(); ++at) {
    SetItemHasChildren(AppendItem(GetRootItem(), places[at].label, places[at].image, -1,
                                  new FolderData(places[at].folder)));
  }
  following_ = false;
}

std::vector<wxTreeItemId> FolderTree::ChildrenOf(const wxTreeItemId& item) const {
  std::vector<wxTreeItemId> children;
  wxTreeItemIdValue cookie;
  for (wxTreeItemId child = GetFirstChild(item, cookie); child.IsOk();
       child = GetNextChild(item, cookie))
    children.push_back(child);
  return children;
}

std::string FolderTree::FolderOf(const wxTreeItemId& item) const {
  const auto* data = item.IsOk() ? static_cast<FolderData*>(GetItemData(item)) : nullptr;
  return data == nullptr ? std::string() : data->folder;
}

std::string FolderTree::FolderAt(const wxPoint& point) const {
  int flags = 0;
  return FolderOf(const_cast<FolderTree*>(this)->HitTest(point, flags));
}

// --- reading ---

void FolderTree::Fill(const wxTreeItemId& item) {
  auto* data = static_cast<FolderData*>(GetItemData(item));
  if (data == nullptr || data->filled) return;
  data->filled = true;
  Read({data->folder});
}

void FolderTree::Reread() {
  std::set<std::string> open;
  const std::function<void(const wxTreeItemId&)> gather = [&](const wxTreeItemId& item) {
    for (const wxTreeItemId& child : ChildrenOf(item)) {
      if (static_cast<FolderData*>(GetItemData(child))->filled) open.insert(FolderOf(child));
      gather(child);
    }
  };
  gather(GetRootItem());
  Read({open.begin(), open.end()});
}

void FolderTree::Read(std::vector<std::string> folders) {
  const bool begun = RunLoose([this, alive = std::weak_ptr(alive_), folders = std::move(folders)] {
    for (const std::string& folder : folders) {
      if (alive.expired()) return;
      wxTheApp->CallAfter([this, alive, folder, names = SubfolderNames(folder)] {
        if (!alive.expired()) ShowNames(folder, names);
      });
    }
    wxTheApp->CallAfter([this, alive] {
      if (!alive.expired()) watch_.ReadingEnded();
    });
  });
  if (!begun) watch_.ReadingEnded();
}

void FolderTree::ShowNames(const std::string& folder, const std::vector<std::string>& names) {
  // A folder may occur in the tree more than once: below another top-level folder and in the file
  // system.
  for (const wxTreeItemId& place : ChildrenOf(GetRootItem())) {
    wxTreeItemId item = place;
    while (item.IsOk() && FolderOf(item) != folder) item = FindChild(item, folder);
    if (item.IsOk() && static_cast<FolderData*>(GetItemData(item))->filled)
      MergeNames(item, folder, names);
  }
  LogEvent("tree-names", std::to_string(names.size()) + " " + folder);
  opening_.erase(folder);
  watch_.Watch(folder);
  FollowOn();
}

// --- dragging ---

void FolderTree::BeginDrag(const wxTreeItemId& item) {
  const std::string folder = FolderOf(item);
  if (platform::FileNameOf(folder).empty()) return;
  FileListData files(std::vector{folder});
  wxDropSource source(files, this);
  source.DoDragDrop(wxDrag_AllowMove);
}

void FolderTree::MarkDrop(const wxPoint* point) {
  int flags = 0;
  const wxTreeItemId item = point == nullptr ? wxTreeItemId() : HitTest(*point, flags);
  if (item == drop_) return;
  if (drop_.IsOk()) SetItemDropHighlight(drop_, false);
  drop_ = item;
  if (item.IsOk()) SetItemDropHighlight(item, true);
  if (item.IsOk()) openTimer_.StartOnce(kOpenMs);
  if (!item.IsOk()) openTimer_.Stop();
  LogEvent("tree-drop", FolderOf(item));
}

// Keeps the state of existing folders, expanded or not.
void FolderTree::MergeNames(const wxTreeItemId& item, const std::string& folder,
                            const std::vector<std::string>& names) {
  following_ = true;
  const std::set<std::string> there(names.begin(), names.end());
  for (const wxTreeItemId& child : ChildrenOf(item)) {
    if (there.contains(std::string(platform::FileNameOf(FolderOf(child))))) continue;
    watch_.Unwatch(FolderOf(child));  // a renamed folder would be watched by its old name
    MarkDrop(nullptr);  // it may lie in this folder; the next motion marks it again
    Delete(child);
  }
  std::set<std::string> shown;
  for (const wxTreeItemId& child : ChildrenOf(item)) shown.insert(FolderOf(child));
  for (size_t at = 0; at < names.size(); ++at) {
    std::string path = platform::JoinFolder(folder, names[at]);
    if (shown.contains(path)) continue;
    SetItemHasChildren(
        InsertItem(item, at, Shown(names[at]), kFolderImage, -1, new FolderData(std::move(path))));
  }
  SetItemHasChildren(item, !names.empty());
  if (opening_.contains(folder) && !names.empty()) Expand(item);
  following_ = false;
}

// --- following the browser ---

wxTreeItemId FolderTree::FindChild(const wxTreeItemId& item, const std::string& folder) const {
  for (const wxTreeItemId& child : ChildrenOf(item)) {
    if (LiesIn(folder, FolderOf(child))) return child;
  }
  return {};
}

wxTreeItemId FolderTree::NearestItem(const std::string& folder) const {
  wxTreeItemId item;
  for (const wxTreeItemId& place : ChildrenOf(GetRootItem())) {
    if (LiesIn(folder, FolderOf(place)) &&
        (!item.IsOk() || FolderOf(place).size() > FolderOf(item).size()))
      item = place;
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
  if (FolderOf(GetSelection()) == followed_) return;
  const wxTreeItemId item = NearestItem(followed_);
  if (!item.IsOk()) return;
  following_ = true;
  if (FolderOf(item) == followed_) {
    SelectItem(item);
    EnsureVisible(item);
  } else {
    Fill(item);
  }
  following_ = false;
}

// --- folder commands ---

void FolderTree::ShowMenu(const wxTreeItemId& item, const wxPoint& point) {
  const std::string folder = FolderOf(item);
  if (folder.empty()) return;
  const bool named = !platform::FileNameOf(folder).empty();
  wxMenu menu;
  const int open = menu.Append(wxID_ANY, Label("&Open"))->GetId();
  const int openInTab = menu.Append(wxID_ANY, Label("Open in new &tab"))->GetId();
  menu.AppendSeparator();
  const int newFolder = menu.Append(wxID_ANY, Label("&New folder..."))->GetId();
  wxMenuItem* const rename = menu.Append(wxID_ANY, Label("&Rename..."));
  rename->Enable(named);
  menu.AppendSeparator();
  const int toggle = menu.Append(wxID_ANY, favorites_.Has(folder) ? Label("Remove from &favorites")
                                                                  : Label("Add to &favorites"))
                         ->GetId();
  LogEvent("tree-menu", folder);
  const int chosen = GetPopupMenuSelectionFromUser(menu, point);
  if (chosen == open) events_.chosen(folder);
  if (chosen == openInTab) events_.openInTab(folder);
  if (chosen == newFolder) events_.newFolder(folder);
  if (chosen == rename->GetId()) AskForName(folder);
  if (chosen == toggle) events_.toggleFavorite(folder);
}

void FolderTree::AskForName(const std::string& folder) {
  const std::string name(platform::FileNameOf(folder));
  wxTextEntryDialog dialog(this, Label("New name:"), Label("Rename"), Shown(name));
  if (dialog.ShowModal() != wxID_OK) return;
  const std::string typed = Utf8(dialog.GetValue());
  if (!typed.empty() && typed != name) events_.rename(folder, typed);
}

}  // namespace fotomill::desktop
