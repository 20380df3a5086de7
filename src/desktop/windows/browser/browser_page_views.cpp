// The view of a browser: thumbnails, names or details, their size and order.

#include <wx/simplebook.h>

#include <algorithm>

#include "core/choice_lists.h"
#include "desktop/models/browser/thumbnail_side.h"
#include "desktop/models/shell/event_log.h"
#include "desktop/windows/browser/browser_bar.h"
#include "desktop/windows/browser/browser_page.h"
#include "desktop/windows/browser/details_list.h"
#include "desktop/windows/browser/thumbnail_canvas.h"
#include "desktop/windows/widgets/wx_text.h"
#include "settings/settings.h"

namespace fotomill::desktop {

namespace {

// pages of the book; the second is created when first shown
enum View { kThumbnailView, kDetailsView };

}  // namespace

bool BrowserPage::ShowsDetails() const { return views_->GetSelection() == kDetailsView; }

void BrowserPage::ShowView() {
  const bool details = model_.Modes().view == choice::kViewDetails;
  if (details && details_ == nullptr) {
    DetailsList::Events events;
    events.selectionChanged = [this] { host_.BrowserChanged(); };
    events.activated = [this](size_t line) { Activate(line); };
    events.contextMenu = [this](size_t line, const wxPoint& place) {
      host_.ShowContextMenu(*details_, place, line != kNoLine);
    };
    events.sort = [this](int32_t sort) {
      SetSort(sort, model_.Modes().sort == sort && !model_.Descending());
    };
    events.dragBegins = [this] { return FilesToDrag(); };
    details_ = new DetailsList(views_, model_, host_.Columns(), thumbnails_, events);
    views_->AddPage(details_, Label("Details"));
  }
  const bool hadFocus = canvas_->HasFocus() || (details_ != nullptr && details_->HasFocus());
  views_->SetSelection(details ? kDetailsView : kThumbnailView);
  bar_->ShowView();
  ShowLines();
  if (details) {
    details_->ShowSelection();
  } else {
    canvas_->ShowLine(model_.Selected().Focus());
  }
  if (hadFocus) FocusList();
  StartFacts();
}

void BrowserPage::ShowLines() {
  if (ShowsDetails()) {
    details_->ModelChanged();
  } else {
    canvas_->ModelChanged();
  }
}

void BrowserPage::ShowAs(const FolderView& view) {
  model_.SetView(view);
  ShowView();
  host_.BrowserChanged();
}

// The user's choice is saved for this folder, and used for folders without a saved view.
void BrowserPage::ChooseView(const FolderView& view) {
  base_ = view;
  if (!found_) host_.KeepView(model_.Folder(), view);
  ShowAs(view);
}

void BrowserPage::SetViewMode(int32_t mode) {
  settings.ThumbnailSide = 0;
  FolderView view = model_.View();
  view.modes.view = mode;
  ChooseView(view);
}

void BrowserPage::SetSort(int32_t sort, bool descending) {
  FolderView view = model_.View();
  view.modes.sort = sort;
  view.descending = descending;
  ChooseView(view);
}

void BrowserPage::SetThumbnailMode(int32_t mode) {
  FolderView view = model_.View();
  view.modes.thumbnails = base_.modes.thumbnails = mode;
  ShowAs(view);
}

void BrowserPage::ChangeSize(int steps) {
  const int32_t view = model_.Modes().view;
  const bool thumbnails = view >= choice::kViewSmall;
  const int32_t side = SideInView(view, settings.ThumbnailSide);
  if (!thumbnails || (steps < 0 && side == kSmallestSide)) {
    const int32_t other = std::clamp(view + steps, choice::kViewList + 0, choice::kViewSmall + 0);
    if (other != view) SetViewMode(other);
  } else {
    SetSide(SteppedSide(side, steps));
  }
}

void BrowserPage::SetSide(int32_t side) {
  if (model_.Modes().view >= choice::kViewSmall &&
      side == SideInView(model_.Modes().view, settings.ThumbnailSide))
    return;
  FolderView view = model_.View();
  view.modes.view = ViewOfSide(side);
  settings.ThumbnailSide = side;
  LogEvent("thumbnail-side", std::to_string(side));
  ChooseView(view);
}

void BrowserPage::SetGrouping(DateGrouping grouping) {
  settings.BrowserGrouping = static_cast<int32_t>(grouping);
  model_.SetGrouping(grouping);
  LogEvent("groups", std::to_string(model_.Groups().size()));
  ShowView();
  host_.BrowserChanged();
}

void BrowserPage::ShowSubfolders(bool show) {
  if (found_ || show == subfolders_) return;
  subfolders_ = show;
  offer_.Forget();
  Reload();
}

}  // namespace fotomill::desktop
