#include "desktop/windows/plugin_box.h"

#include <wx/button.h>
#include <wx/dataview.h>
#include <wx/msgdlg.h>
#include <wx/sizer.h>
#include <wx/stattext.h>

#include "core/configuration.h"
#include "core/settings.h"
#include "desktop/event_log.h"
#include "desktop/windows/wx_text.h"
#include "picture/registry.h"
#include "platform/folders.h"
#include "platform/paths.h"
#include "plugins/plugin_table.h"

namespace fotomill::desktop {

namespace {

constexpr const char* kTitle = "Plug-ins";

}  // namespace

PluginBox::PluginBox(wxWindow* parent)
    : wxDialog(parent, wxID_ANY, kTitle, wxDefaultPosition, wxDefaultSize, wxDEFAULT_DIALOG_STYLE | wxRESIZE_BORDER, "PluginBox") {
  const int gap = FromDIP(10);
  list_ = new wxDataViewListCtrl(this, wxID_ANY, wxDefaultPosition, FromDIP(wxSize(720, 220)), wxDV_SINGLE | wxDV_ROW_LINES);
  list_->SetName(kTitle);
  struct Column {
    const char* title;
    int width;
  };
  for (const Column& column : {Column{"Extension", 90}, {"Plug-in", 140}, {"Formats", 200}, {"Can", 130}, {"Module", 150}}) {
    list_->AppendTextColumn(column.title, wxDATAVIEW_CELL_INERT, FromDIP(column.width));
  }
  const std::string folder = platform::JoinFolder(platform::ProgramFolder(), "plugin");
  auto* place = new wxStaticText(this, wxID_ANY, Shown("Plug-ins lie in the folder " + folder), wxDefaultPosition, wxDefaultSize, wxST_ELLIPSIZE_MIDDLE);
  auto* buttons = new wxBoxSizer(wxHORIZONTAL);
  buttons->Add(new wxButton(this, wxID_PREFERENCES, "&Configure..."));
  buttons->AddStretchSpacer();
  buttons->Add(new wxButton(this, wxID_CANCEL, "Close"));
  auto* column = new wxBoxSizer(wxVERTICAL);
  column->Add(list_, wxSizerFlags(1).Expand().Border(wxALL, gap));
  column->Add(place, wxSizerFlags().Expand().Border(wxLEFT | wxRIGHT, gap));
  column->Add(buttons, wxSizerFlags().Expand().Border(wxALL, gap));
  SetSizerAndFit(column);
  Bind(wxEVT_BUTTON, [this](wxCommandEvent&) { Configure(); }, wxID_PREFERENCES);
  list_->Bind(wxEVT_DATAVIEW_ITEM_ACTIVATED, [this](wxDataViewEvent&) { Configure(); });
  FillList();
  CentreOnParent();
  list_->SetFocus();
}

void PluginBox::FillList() {
  (void)PluginFormats();  // modules are loaded when somebody asks
  for (int32_t index = 0; index < PluginFormatCount(); ++index) {
    const PluginEntry& entry = PluginRow(index);
    std::string can = entry.exports.writeImage != nullptr ? "read and write" : "read";
    if (entry.exports.configure != nullptr) can += ", settings";
    wxVector<wxVariant> cells;
    for (const std::string_view cell : {entry.extension.view(), entry.textA.view(), entry.textB.view(), std::string_view(can),
                                        platform::FileNameOf(entry.path)}) {
      cells.push_back(Shown(cell));
    }
    list_->AppendItem(cells);
  }
  const int count = PluginFormatCount();
  if (count > 0) list_->SelectRow(settings.PluginConfigIndex >= 0 && settings.PluginConfigIndex < count ? static_cast<unsigned>(settings.PluginConfigIndex) : 0);
  FindWindow(wxID_PREFERENCES)->Enable(count > 0);
  LogEvent("plugins", "formats=" + std::to_string(count));
}

void PluginBox::Configure() {
  const int row = list_->GetSelectedRow();
  if (row == wxNOT_FOUND) return;
  if (!ConfigurePlugin(row)) wxMessageBox(Shown(kNothingToConfigure), kTitle, wxOK | wxICON_INFORMATION, this);
}

}  // namespace fotomill::desktop
