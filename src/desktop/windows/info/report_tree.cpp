#include "desktop/windows/info/report_tree.h"

#include <wx/clntdata.h>
#include <wx/dataview.h>
#include <wx/utils.h>

#include "desktop/models/shell/event_log.h"
#include "desktop/windows/widgets/looks.h"
#include "desktop/windows/widgets/text_sizes.h"
#include "desktop/windows/widgets/wx_text.h"

namespace fotomill::desktop {

ReportTree::ReportTree(wxWindow* parent)
    : wxTreeListCtrl(parent, wxID_ANY, wxDefaultPosition, wxDefaultSize, wxTL_SINGLE) {
  SetName(Label("Facts"));
  GetDataView()->SetFont(FontOf(*this, TextSize::Normal));
  Bind(wxEVT_TREELIST_ITEM_ACTIVATED, [this](wxTreeListEvent& event) {
    OpenLink(event.GetItem());
    event.Skip();
  });
  AppendColumn(Label("Name"), TextWidth(*this, 260), wxALIGN_LEFT, wxCOL_RESIZABLE);
  AppendColumn(Label("Value"), TextWidth(*this, 360), wxALIGN_LEFT, wxCOL_RESIZABLE);
}

void ReportTree::Show(std::span<const InfoSection> sections) {
  DeleteAllItems();
  for (const InfoSection& section : sections) {
    const wxTreeListItem head = AppendItem(GetRootItem(), Shown(section.title));
    for (const InfoLine& line : section.lines) {
      const wxTreeListItem item =
          AppendItem(head, Shown(line.label.empty() ? line.value : line.label));
      if (!line.label.empty()) SetItemText(item, 1, Shown(line.value));
      if (!line.link.empty()) SetItemData(item, new wxStringClientData(Shown(line.link)));
    }
    if (!section.folded) Expand(head);
  }
  const wxTreeListItem first = GetFirstItem();
  if (first.IsOk()) Select(first);
}

// Opens the link of a line on Enter or a double click.
void ReportTree::OpenLink(wxTreeListItem item) {
  const auto* const link = static_cast<const wxStringClientData*>(GetItemData(item));
  if (link == nullptr) return;
  LogEvent("link", Utf8(link->GetData()));
  wxLaunchDefaultBrowser(link->GetData());
}

wxString ReportTree::SelectedValue() const {
  const wxTreeListItem item = GetSelection();
  if (!item.IsOk()) return {};
  const wxString value = GetItemText(item, 1);
  return value.empty() ? GetItemText(item, 0) : value;
}

}  // namespace fotomill::desktop
