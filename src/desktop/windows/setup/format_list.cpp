#include "desktop/windows/setup/format_list.h"

#include <wx/msgdlg.h>

#include "desktop/models/setup/setup_help.h"
#include "desktop/models/shell/event_log.h"
#include "desktop/windows/dialogs/help.h"
#include "desktop/windows/widgets/looks.h"
#include "desktop/windows/widgets/wx_text.h"
#include "registry/registry.h"
#include "settings/format_switches.h"
#include "texts/texts.h"

namespace fotomill::desktop {

namespace {

enum Column { kOnColumn, kFormatColumn, kBuildColumn };

wxString WorksHere(const FormatEntry& row) {
  const bool reads = CanRead(row), writes = CanWrite(row);
  if (reads && writes) return Tr("read and write");
  if (reads || writes) return reads ? Tr("read") : Tr("write");
  return Tr("not in this build");
}

// Formats that this build can neither read nor write are gray.
class FormatLines : public wxDataViewListStore {
 public:
  bool GetAttrByRow(unsigned row, unsigned, wxDataViewItemAttr& look) const override {
    const auto index = static_cast<int32_t>(GetItemData(GetItem(row)));
    if (CanRead(FormatRow(index)) || CanWrite(FormatRow(index))) return false;
    look.SetColour(ToWx(CurrentPalette().note));
    return true;
  }
};

}  // namespace

FormatList::FormatList(wxWindow* parent)
    : wxDataViewListCtrl(parent, wxID_ANY, wxDefaultPosition, parent->FromDIP(wxSize(-1, 280)),
                         wxDV_SINGLE | wxDV_ROW_LINES) {
  const wxObjectDataPtr<FormatLines> lines(new FormatLines);
  AssociateModel(lines.get());
  SetName(Label("Formats"));
  AppendToggleColumn(Label("On"), wxDATAVIEW_CELL_ACTIVATABLE, FromDIP(50), wxALIGN_CENTER);
  AppendTextColumn(Label("Format"), wxDATAVIEW_CELL_INERT, TextWidth(*this, 300));
  AppendTextColumn(Label("In this build"), wxDATAVIEW_CELL_INERT, TextWidth(*this, 150));
  for (const int32_t index : FormatListRows()) {
    const FormatEntry& row = FormatRow(index);
    wxVector<wxVariant> cells;
    cells.push_back(row.enabled != 0);
    cells.push_back(Shown(row.description));
    cells.push_back(WorksHere(row));
    AppendItem(cells, static_cast<wxUIntPtr>(index));
  }
  Bind(wxEVT_DATAVIEW_ITEM_VALUE_CHANGED, [this](wxDataViewEvent& event) {
    if (event.GetColumn() == kOnColumn) Turn(event.GetItem());
  });
  const auto toggle = [this](const wxDataViewItem& item) {
    if (!item.IsOk()) return;
    const auto line = static_cast<unsigned>(ItemToRow(item));
    SetToggleValue(!GetToggleValue(line, kOnColumn), line, kOnColumn);
    Turn(item);
  };
  Bind(wxEVT_DATAVIEW_ITEM_ACTIVATED,
       [toggle](wxDataViewEvent& event) { toggle(event.GetItem()); });
  Bind(wxEVT_CHAR_HOOK, [this, toggle](wxKeyEvent& event) {
    if (event.GetKeyCode() == WXK_SPACE) return toggle(GetSelection());
    if (event.GetKeyCode() == WXK_F1) return ShowHelp(*this, kFormatsTopic);
    event.Skip();
  });
  if (GetItemCount() > 0) SetCurrentItem(RowToItem(0));
}

void FormatList::Turn(const wxDataViewItem& item) {
  const auto line = static_cast<unsigned>(ItemToRow(item));
  const auto index = static_cast<int32_t>(GetItemData(item));
  const bool on = GetToggleValue(line, kOnColumn);
  if (on == (FormatRow(index).enabled != 0)) return;
  const SaveResult saved = SwitchFormat(index, on);
  LogEvent("formats", Utf8(GetTextValue(line, kFormatColumn)) + (on ? " on" : " off"));
  if (saved == SaveResult::Done || saved == SaveResult::Unchanged) return;
  wxMessageBox(
      Shown(Tr(SaveMessage(saved))) + " " + Label("The change applies until the program exits."),
      Label("Formats"), wxOK | wxICON_WARNING, wxGetTopLevelParent(this));
}

}  // namespace fotomill::desktop
