#include "desktop/windows/widgets/tool_frame.h"

#include <wx/dataview.h>
#include <wx/panel.h>
#include <wx/stattext.h>

#include <vector>

#include "desktop/windows/widgets/looks.h"

namespace fotomill::desktop {

ToolFrame::ToolFrame(wxWindow* parent, const wxString& title, const wxString& name)
    : wxFrame(parent, wxID_ANY, title, wxDefaultPosition, wxDefaultSize,
              wxDEFAULT_FRAME_STYLE | wxFRAME_FLOAT_ON_PARENT, name),
      panel_(new wxPanel(this)) {}

void ToolFrame::LayOut(wxStaticText* note, wxSizer& contents, std::span<const RowButton> buttons,
                       std::initializer_list<wxAcceleratorEntry> keys, const wxSize& size) {
  const int gap = FromDIP(10);
  auto* column = new wxBoxSizer(wxVERTICAL);
  if (note != nullptr)
    column->Add(note, wxSizerFlags().Expand().Border(wxLEFT | wxTOP | wxRIGHT, gap));
  column->Add(&contents, wxSizerFlags(1).Expand().Border(wxALL, gap));
  column->Add(BuildButtonRow(*this, *panel_, buttons),
              wxSizerFlags().Expand().Border(wxLEFT | wxRIGHT | wxBOTTOM, gap));
  panel_->SetSizer(column);
  std::vector<wxAcceleratorEntry> all(keys);
  all.emplace_back(wxACCEL_NORMAL, WXK_ESCAPE, wxID_CLOSE);
  all.emplace_back(wxACCEL_CTRL, 'W', wxID_CLOSE);
  SetAcceleratorTable(wxAcceleratorTable(static_cast<int>(all.size()), all.data()));
  SetSize(FromDIP(size));
  CentreOnParent();
}

wxDataViewListCtrl* NewTextList(wxWindow* parent, const wxString& name,
                                std::initializer_list<TextColumn> columns) {
  auto* list = new wxDataViewListCtrl(parent, wxID_ANY, wxDefaultPosition, wxDefaultSize,
                                      wxDV_SINGLE | wxDV_ROW_LINES);
  list->SetName(name);
  for (const TextColumn& column : columns)
    list->AppendTextColumn(column.title, wxDATAVIEW_CELL_INERT, TextWidth(*parent, column.width));
  return list;
}

}  // namespace fotomill::desktop
