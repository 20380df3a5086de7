#include "desktop/windows/browser/details_list.h"

#include <wx/menu.h>

#include <algorithm>
#include <utility>

#include "desktop/models/shell/event_log.h"
#include "desktop/windows/files/file_list_data.h"
#include "desktop/windows/widgets/text_sizes.h"
#include "desktop/windows/widgets/wx_text.h"

namespace fotomill::desktop {

class DetailsList::Lines : public wxDataViewVirtualListModel {
 public:
  Lines(const BrowserModel& model, DetailsIcons& icons) : model_(model), icons_(icons) {}
  unsigned int GetColumnCount() const { return static_cast<unsigned>(AllDetails().size()); }
  wxString GetColumnType(unsigned int column) const {
    return column == 0 ? "wxDataViewIconText" : "string";
  }
  void GetValueByRow(wxVariant& value, unsigned int row, unsigned int column) const override {
    const bool there = row < model_.LineCount();
    const wxString text = there ? Shown(AllDetails()[column].text(model_.Line(row))) : wxString();
    if (column != 0) {
      value = text;
    } else if (there && icons_.Side() > 0) {
      value << wxDataViewIconText(text, icons_.IconOf(row));
    } else {
      value << wxDataViewIconText(text);
    }
  }
  bool SetValueByRow(const wxVariant&, unsigned int, unsigned int) override { return false; }

 private:
  const BrowserModel& model_;
  DetailsIcons& icons_;
};

DetailsList::DetailsList(wxWindow* parent, BrowserModel& model, DetailColumns& columns,
                         ThumbnailService& thumbnails, Events events)
    : wxDataViewCtrl(parent, wxID_ANY, wxDefaultPosition, wxDefaultSize,
                     wxDV_MULTIPLE | wxDV_ROW_LINES | wxBORDER_NONE, wxDefaultValidator,
                     Label("Details")),
      model_(model),
      columns_(columns),
      events_(std::move(events)),
      icons_(*this, model, thumbnails,
             [this](size_t line) { lines_->RowChanged(static_cast<unsigned>(line)); }),
      lines_(new Lines(model, icons_)) {
  AssociateModel(lines_.get());
  if (icons_.Side() > 0) SetRowHeight(icons_.Side() + FromDIP(4));
  SetFont(FontOf(*this, TextSize::Normal));
  ShowColumns();
  Bind(wxEVT_DATAVIEW_SELECTION_CHANGED, [this](wxDataViewEvent&) { ReadSelection(); });
  Bind(wxEVT_DATAVIEW_ITEM_ACTIVATED, [this](wxDataViewEvent& event) {
    if (event.GetItem().IsOk()) events_.activated(lines_->GetRow(event.GetItem()));
  });
  Bind(wxEVT_DATAVIEW_ITEM_CONTEXT_MENU, [this](wxDataViewEvent& event) {
    const size_t line = event.GetItem().IsOk() ? lines_->GetRow(event.GetItem()) : kNoLine;
    events_.contextMenu(line, ScreenToClient(wxGetMousePosition()));
  });
  Bind(wxEVT_CHAR_HOOK, [this](wxKeyEvent& event) {
    const int key = event.GetKeyCode();
    const bool shiftF10 = key == WXK_F10 && event.ShiftDown();
    if (!shiftF10 && key != WXK_WINDOWS_MENU && key != WXK_MENU) return event.Skip();
    const size_t focus = model_.Selected().Focus();
    const wxRect line =
        focus == kNoLine ? wxRect() : GetItemRect(lines_->GetItem(static_cast<unsigned>(focus)));
    events_.contextMenu(focus, line.GetBottomLeft());
  });
  EnableDragSource(wxDataFormat(wxDF_FILENAME));
  Bind(wxEVT_DATAVIEW_ITEM_BEGIN_DRAG, &DetailsList::OnBeginDrag, this);
  GetMainWindow()->Bind(wxEVT_LEFT_UP, [this](wxMouseEvent& event) {
    beforePress_.clear();
    event.Skip();
  });
  Bind(wxEVT_DATAVIEW_COLUMN_HEADER_CLICK, [this](wxDataViewEvent& event) {
    const int32_t sort = AllDetails()[event.GetDataViewColumn()->GetModelColumn()].sort;
    if (sort >= 0) events_.sort(sort);
  });
  Bind(wxEVT_DATAVIEW_COLUMN_HEADER_RIGHT_CLICK,
       [this](wxDataViewEvent&) { CallAfter([this] { ChooseColumns(); }); });
}

// --- columns ---

void DetailsList::ShowColumns() {
  if (shown_ == columns_) return;
  ClearColumns();
  for (const DetailColumn& column : columns_) {
    const DetailFacts& facts = AllDetails()[column.detail];
    const wxAlignment alignment = facts.number ? wxALIGN_RIGHT : wxALIGN_LEFT;
    wxDataViewRenderer* renderer = nullptr;
    if (column.detail == 0) {
      renderer = new wxDataViewIconTextRenderer("wxDataViewIconText", wxDATAVIEW_CELL_INERT);
    } else {
      renderer = new wxDataViewTextRenderer("string", wxDATAVIEW_CELL_INERT,
                                            alignment | wxALIGN_CENTER_VERTICAL);
    }
    auto* added = new wxDataViewColumn(
        Label(facts.title), renderer, static_cast<unsigned>(column.detail), FromDIP(column.width),
        alignment, wxDATAVIEW_COL_RESIZABLE | wxDATAVIEW_COL_REORDERABLE);
    added->SetHidden(!column.shown);
    AppendColumn(added);
  }
  shown_ = columns_;
}

void DetailsList::KeepColumns() {
  DetailColumns now;
  for (unsigned i = 0; i < GetColumnCount(); ++i) {
    const wxDataViewColumn* const column = GetColumn(i);
    const size_t detail = column->GetModelColumn();
    const auto before = std::ranges::find(shown_, detail, &DetailColumn::detail);
    // Hidden columns have no width, and the last one shown is stretched.
    const bool measured = column->IsShown() && column->GetWidth() > 0;
    now.push_back(
        {detail, measured ? ToDIP(column->GetWidth()) : before->width, column->IsShown()});
  }
  if (now.size() != shown_.size()) return;
  const auto last = std::find_if(now.rbegin(), now.rend(),
                                 [](const DetailColumn& column) { return column.shown; });
  if (last != now.rend())
    last->width = std::ranges::find(shown_, last->detail, &DetailColumn::detail)->width;
  columns_ = shown_ = now;
}

void DetailsList::ChooseColumns() {
  wxMenu menu;
  const int first = wxID_HIGHEST + 1;
  KeepColumns();
  for (const DetailColumn& column : columns_) {
    wxMenuItem* item = menu.AppendCheckItem(first + static_cast<int>(column.detail),
                                            Label(AllDetails()[column.detail].title));
    item->Check(column.shown);
    item->Enable(column.detail != 0);
  }
  LogEvent("column-menu");
  const int chosen = GetPopupMenuSelectionFromUser(menu, ScreenToClient(wxGetMousePosition()));
  if (chosen < first) return;
  const auto column =
      std::ranges::find(columns_, static_cast<size_t>(chosen - first), &DetailColumn::detail);
  column->shown = !column->shown;
  ShowColumns();
  ModelChanged();
  LogEvent("columns", DetailColumnsText(columns_));
}

// --- lines ---

void DetailsList::ThumbnailsCame(const std::vector<ThumbnailLoader::Result>& results) {
  icons_.ThumbnailsCame(results);
}

void DetailsList::ShowLines() {
  icons_.Forget();
  changing_ = true;
  lines_->Reset(static_cast<unsigned>(model_.LineCount()));
  changing_ = false;
}

// Keeps the top line in place, if possible.
void DetailsList::ModelChanged() {
  const wxDataViewItem top = GetTopItem();
  const unsigned row = top.IsOk() ? lines_->GetRow(top) : 0;
  ShowLines();
  ShowSelection();
  if (row == 0 || row >= model_.LineCount()) return;
  EnsureVisible(lines_->GetItem(static_cast<unsigned>(model_.LineCount()) - 1));
  EnsureVisible(lines_->GetItem(row));
}

void DetailsList::ShowSelection() {
  changing_ = true;
  wxDataViewItemArray items;
  for (const size_t line : model_.Selected().SelectedLines())
    items.Add(lines_->GetItem(static_cast<unsigned>(line)));
  SetSelections(items);
  const size_t focus = model_.Selected().Focus();
  if (focus != kNoLine) {
    const wxDataViewItem item = lines_->GetItem(static_cast<unsigned>(focus));
    if (model_.Selected().SelectedCount() <= 1 && model_.Selected().IsSelected(focus))
      SetCurrentItem(item);
    EnsureVisible(item);
  }
  changing_ = false;
}

void DetailsList::ReadSelection() {
  if (changing_) return;
  wxDataViewItemArray items;
  GetSelections(items);
  std::vector<bool> selected(model_.LineCount());
  for (const wxDataViewItem& item : items) {
    const unsigned row = lines_->GetRow(item);
    if (row < selected.size()) selected[row] = true;
  }
  const wxDataViewItem current = GetCurrentItem();
  const size_t focus = current.IsOk() ? lines_->GetRow(current) : model_.Selected().Focus();
  if (wxGetMouseState().LeftIsDown()) beforePress_ = model_.Selected().SelectedLines();
  model_.Selected().Assign(std::move(selected), focus, focus);
  events_.selectionChanged();
}

// Pressing on one of several selected lines selects it alone, so they are selected again first.
void DetailsList::OnBeginDrag(wxDataViewEvent& event) {
  const size_t line = event.GetItem().IsOk() ? lines_->GetRow(event.GetItem()) : kNoLine;
  const std::vector<size_t> before = std::exchange(beforePress_, {});
  if (std::ranges::find(before, line) != before.end() && before.back() < model_.LineCount()) {
    std::vector<bool> selected(model_.LineCount());
    for (const size_t other : before) selected[other] = true;
    model_.Selected().Assign(std::move(selected), line, line);
    ShowSelection();
    events_.selectionChanged();
  }
  const DraggedFiles dragged = events_.dragBegins();
  if (dragged.paths.empty()) return event.Veto();
  event.SetDataObject(new FileListData(dragged.paths));
  event.SetDragFlags(dragged.mayMove ? wxDrag_AllowMove : wxDrag_CopyOnly);
}

}  // namespace fotomill::desktop
