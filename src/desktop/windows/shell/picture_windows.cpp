#include "desktop/windows/shell/picture_windows.h"

#include "batch/external_program.h"
#include "desktop/models/shell/event_log.h"
#include "desktop/windows/compare/compare_frame.h"
#include "desktop/windows/files/open_with.h"
#include "desktop/windows/metadata/exif_edit_frame.h"
#include "desktop/windows/shell/browser_tabs.h"
#include "desktop/windows/shell/shell.h"
#include "desktop/windows/similar/similar_frame.h"

namespace fotomill::desktop {

ViewFrame& PictureWindows::View(const std::vector<std::string>& list, const std::string& file,
                                bool another) {
  if (!another && lastUsed_ != nullptr && !lastUsed_->IsBeingDeleted()) {
    lastUsed_->ShowList(list, file);
    if (lastUsed_->IsIconized()) lastUsed_->Iconize(false);
    lastUsed_->Raise();
    return *lastUsed_;
  }
  auto* view = new ViewFrame(shell_, list, file);
  view->Bind(wxEVT_ACTIVATE, [this, view](wxActivateEvent& event) {
    if (event.GetActive()) lastUsed_ = view;
    event.Skip();
  });
  lastUsed_ = view;
  view->Show();
  LogEvent("view-window", another ? "another" : "new");
  return *view;
}

void PictureWindows::ViewFromBrowser(const std::string& path, bool another) {
  const BrowserPage* browser = shell_.Tabs().Front();
  if (browser == nullptr) return;
  if (NeedsExternalProgram(path)) return shell_.Programs().Open(path);
  const std::vector<std::string> selected = browser->Model().FilesForFunction();
  const bool some = selected.size() > 1 || browser->ShowsFound();
  View(selected.size() > 1 ? selected : browser->Model().ShownFiles(), path, another)
      .FollowFolder(some ? std::string() : browser->Model().Folder());
}

void PictureWindows::ViewBeforeFolder(const std::string& path, std::function<void()> showFolder) {
  ViewFrame& view = View({path}, path);
  view.WhenShown([this, showFolder = std::move(showFolder), weak = wxWeakRef<ViewFrame>(&view)] {
    wantsList_ = weak.get();
    showFolder();
    // The new tab has requested the focus; give it back to the picture.
    shell_.Window().CallAfter([weak] {
      if (weak == nullptr) return;
      weak->Raise();
      weak->Canvas().SetFocus();
    });
  });
}

std::vector<ViewFrame*> PictureWindows::Views() const {
  std::vector<ViewFrame*> views;
  for (wxWindow* window : shell_.Window().GetChildren()) {
    if (auto* view = dynamic_cast<ViewFrame*>(window)) views.push_back(view);
  }
  return views;
}

void PictureWindows::OfferList(const BrowserPage& browser) {
  const BrowserModel& model = browser.Model();
  if (browser.Listing() || browser.ShowsFound() || !model.Listed()) return;
  if (wantsList_ == nullptr && model.Generation() == offered_ && model.Folder() == offeredFolder_)
    return;
  offered_ = model.Generation();
  offeredFolder_ = model.Folder();
  std::vector<std::string> files;
  for (ViewFrame* const view : Views()) {
    if (view != wantsList_ && view->FollowedFolder() != model.Folder()) continue;
    if (files.empty()) files = model.ShownFiles();
    if (view->UseList(files) && view == wantsList_) {
      view->FollowFolder(model.Folder());
      wantsList_ = nullptr;
    }
  }
}

void PictureWindows::FollowRename(const std::string& from, const std::string& to) {
  for (ViewFrame* const view : Views()) view->FollowRename(from, to);
}

void PictureWindows::FilesChanged() {
  for (ViewFrame* const view : Views()) view->FilesChanged();
  for (wxWindow* window : shell_.Window().GetChildren()) {
    if (auto* compare = dynamic_cast<CompareFrame*>(window)) compare->FilesChanged();
  }
  RefreshExifEditors();
  RefreshSimilar();
}

}  // namespace fotomill::desktop
