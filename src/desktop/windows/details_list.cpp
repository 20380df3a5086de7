#include "desktop/windows/details_list.h"

#include "core/choice_lists.h"
#include "core/settings.h"
#include "core/text.h"
#include "desktop/windows/wx_text.h"
#include "picture/registry.h"

namespace fotomill::desktop {

namespace {

std::string DimensionsText(const FolderItem& item) {
  return item.width == 0 ? std::string() : std::to_string(item.width) + " x " + std::to_string(item.height);
}

struct Column {
  const char* title;
  int width;  // device-independent pixels
  wxAlignment alignment;
  int32_t sort;  // choice::SortMode
  std::string (*text)(const FolderItem& item);
};

constexpr Column kColumns[] = {
    {"Name", 260, wxALIGN_LEFT, choice::kSortName, [](const FolderItem& item) { return item.name; }},
    {"Type", 190, wxALIGN_LEFT, choice::kSortType,
     [](const FolderItem& item) { return item.folder ? std::string("Folder") : DescribeFileType(item.name); }},
    {"Size", 110, wxALIGN_RIGHT, choice::kSortSize,
     [](const FolderItem& item) { return item.folder ? std::string() : SizeText(item.size, settings.DetailSizeMode); }},
    {"Date", 140, wxALIGN_LEFT, choice::kSortDate,
     [](const FolderItem& item) { return item.modified == 0 ? std::string() : DateText(item.modified); }},
    {"Dimensions", 110, wxALIGN_RIGHT, choice::kSortDimensions, DimensionsText},
    {"Depth", 70, wxALIGN_RIGHT, -1,
     [](const FolderItem& item) { return item.bits == 0 ? std::string() : std::to_string(item.bits) + " bits"; }},
};

}  // namespace

class DetailsList::Lines : public wxDataViewVirtualListModel {
 public:
  explicit Lines(const BrowserModel& model) : model_(model) {}
  unsigned int GetColumnCount() const { return static_cast<unsigned>(std::size(kColumns)); }
  wxString GetColumnType(unsigned int) const { return "string"; }
  void GetValueByRow(wxVariant& value, unsigned int row, unsigned int column) const override {
    value = row < model_.LineCount() ? Shown(kColumns[column].text(model_.Line(row))) : wxString();
  }
  bool SetValueByRow(const wxVariant&, unsigned int, unsigned int) override { return false; }

 private:
  const BrowserModel& model_;
};

DetailsList::DetailsList(wxWindow* parent, BrowserModel& model, Events events)
    : wxDataViewCtrl(parent, wxID_ANY, wxDefaultPosition, wxDefaultSize, wxDV_MULTIPLE | wxDV_ROW_LINES | wxBORDER_NONE,
                     wxDefaultValidator, "Details"),
      model_(model),
      events_(std::move(events)),
      lines_(new Lines(model)) {
  AssociateModel(lines_.get());
  for (const Column& column : kColumns) {
    auto* added =
        new wxDataViewColumn(column.title, new wxDataViewTextRenderer("string", wxDATAVIEW_CELL_INERT, column.alignment),
                             static_cast<unsigned>(&column - kColumns), FromDIP(column.width), column.alignment,
                             wxDATAVIEW_COL_RESIZABLE | wxDATAVIEW_COL_REORDERABLE);
    AppendColumn(added);
  }
  Bind(wxEVT_DATAVIEW_SELECTION_CHANGED, [this](wxDataViewEvent&) { ReadSelection(); });
  Bind(wxEVT_DATAVIEW_ITEM_ACTIVATED, [this](wxDataViewEvent& event) {
    if (event.GetItem().IsOk()) events_.activated(lines_->GetRow(event.GetItem()));
  });
  Bind(wxEVT_DATAVIEW_ITEM_CONTEXT_MENU, [this](wxDataViewEvent& event) {
    const size_t line = event.GetItem().IsOk() ? lines_->GetRow(event.GetItem()) : kNoLine;
    events_.contextMenu(line, ScreenToClient(wxGetMousePosition()));
  });
  Bind(wxEVT_DATAVIEW_COLUMN_HEADER_CLICK, [this](wxDataViewEvent& event) {
    const int32_t sort = kColumns[event.GetDataViewColumn()->GetModelColumn()].sort;
    if (sort >= 0) events_.sort(sort);
  });
}

void DetailsList::ModelChanged() {
  changing_ = true;
  lines_->Reset(static_cast<unsigned>(model_.LineCount()));
  changing_ = false;
  ShowSelection();
}

void DetailsList::ShowSelection() {
  changing_ = true;
  wxDataViewItemArray items;
  for (const size_t line : model_.Selected().SelectedLines()) items.Add(lines_->GetItem(static_cast<unsigned>(line)));
  SetSelections(items);
  const size_t focus = model_.Selected().Focus();
  if (focus != kNoLine) {
    const wxDataViewItem item = lines_->GetItem(static_cast<unsigned>(focus));
    if (model_.Selected().SelectedCount() <= 1 && model_.Selected().IsSelected(focus)) SetCurrentItem(item);
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
  model_.Selected().Assign(std::move(selected), focus, focus);
  events_.selectionChanged();
}

}  // namespace fotomill::desktop
