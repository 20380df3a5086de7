#include "desktop/windows/shell/folder_pane.h"

#include <wx/frame.h>
#include <wx/splitter.h>

#include <algorithm>

#include "desktop/models/shell/event_log.h"
#include "desktop/windows/browser/folder_tree.h"
#include "desktop/windows/files/file_actions.h"
#include "desktop/windows/files/folder_drop.h"
#include "desktop/windows/shell/browser_tabs.h"
#include "desktop/windows/shell/shell.h"
#include "settings/settings.h"
#include "texts/texts.h"

namespace fotomill::desktop {

namespace {

constexpr int kUsualWidth = 230, kLeastShown = 160, kLeastWidth = 120;  // device-independent pixels

}  // namespace

FolderPane::FolderPane(Shell& shell) : shell_(shell) {
  favorites_.Load();
  splitter_ = new wxSplitterWindow(&shell.Window(), wxID_ANY, wxDefaultPosition, wxDefaultSize,
                                   wxSP_LIVE_UPDATE | wxSP_NOBORDER);
  splitter_->SetMinimumPaneSize(splitter_->FromDIP(kLeastWidth));
  FolderTree::Events events;
  events.chosen = [this](const std::string& folder) {
    if (BrowserPage* browser = shell_.Tabs().Front()) browser->Open(folder);
  };
  events.openInTab = [this](const std::string& folder) { shell_.Tabs().Open(folder); };
  events.newFolder = [this](const std::string& folder) { shell_.Files().NewFolder(folder); };
  events.rename = [this](const std::string& folder, const std::string& name) {
    shell_.Files().Rename(folder, name);
  };
  events.toggleFavorite = [this](const std::string& folder) { ToggleFavorite(folder); };
  tree_ = new FolderTree(splitter_, favorites_, events);
  tree_->SetDropTarget(
      new FolderDrop([this](const wxPoint& place) { return tree_->FolderAt(place); },
                     [this](const std::vector<std::string>& files, const std::string& folder,
                            bool move) { shell_.Files().Drop(files, folder, move); },
                     [this](const wxPoint* place) { tree_->MarkDrop(place); }));
}

wxWindow* FolderPane::Parent() const { return splitter_; }

void FolderPane::PlaceBeside(wxWindow& other) {
  other_ = &other;
  const int width =
      settings.RememberNavPaneHPosition > 0 ? settings.RememberNavPaneHPosition : kUsualWidth;
  splitter_->SplitVertically(tree_, other_, splitter_->FromDIP(width));
}

bool FolderPane::Shown() const { return splitter_->IsSplit(); }

void FolderPane::Show(bool show) {
  if (show == Shown()) return;
  if (show) {
    tree_->Show();
    splitter_->SplitVertically(
        tree_, other_,
        splitter_->FromDIP(std::max(settings.RememberNavPaneHPosition, kLeastShown)));
  } else {
    KeepWidth();
    splitter_->Unsplit(tree_);
  }
}

void FolderPane::KeepWidth() {
  if (Shown()) settings.RememberNavPaneHPosition = splitter_->ToDIP(splitter_->GetSashPosition());
}

void FolderPane::Follow(const std::string& folder) { tree_->Follow(folder); }

void FolderPane::UpdatePlaces() { tree_->UpdatePlaces(); }

void FolderPane::Reread() {
  tree_->UpdatePlaces();
  tree_->Reread();
}

void FolderPane::FollowRename(const std::string& from, const std::string& to) {
  if (favorites_.FollowRename(from, to)) tree_->UpdatePlaces();
}

void FolderPane::ToggleFavorite(const std::string& folder) {
  const bool written = favorites_.Has(folder) ? favorites_.Remove(folder) : favorites_.Add(folder);
  if (!written) shell_.Report(Tr("The list of favorites could not be saved."));
  tree_->UpdatePlaces();
  LogEvent("favorites", std::to_string(favorites_.Folders().size()));
}

}  // namespace fotomill::desktop
