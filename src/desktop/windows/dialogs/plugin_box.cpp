#include "desktop/windows/dialogs/plugin_box.h"

#include <wx/button.h>
#include <wx/dataview.h>
#include <wx/msgdlg.h>
#include <wx/sizer.h>
#include <wx/stattext.h>

#include <algorithm>

#include "desktop/models/shell/event_log.h"
#include "desktop/windows/dialogs/module_options_box.h"
#include "desktop/windows/widgets/looks.h"
#include "desktop/windows/widgets/wx_text.h"
#include "platform/files.h"
#include "platform/folders.h"
#include "platform/paths.h"
#include "platform/process.h"
#include "plugins/plugin_table.h"
#include "registry/registry.h"
#include "settings/plugin_settings.h"
#include "settings/settings.h"
#include "texts/texts.h"

namespace fotomill::desktop {

namespace {

constexpr const char* kTitle = TrLater("Plug-ins");

// "libavif 0.11.1 (BSD-2-Clause), ..." from lines of name, version and license.
std::string LibrariesText(std::string_view lines) {
  std::string text;
  while (!lines.empty()) {
    std::string line(lines.substr(0, lines.find('\n')));
    lines.remove_prefix(std::min(line.size() + 1, lines.size()));
    const size_t first = line.find('\t'), second = line.rfind('\t');
    if (first == std::string::npos || first == second) continue;
    if (!text.empty()) text += ", ";
    text.append(line, 0, first).append(" ").append(line, first + 1, second - first - 1);
    text.append(" (").append(line, second + 1).append(")");
  }
  return text;
}

}  // namespace

PluginBox::PluginBox(wxWindow* parent)
    : wxDialog(parent, wxID_ANY, Label(kTitle), wxDefaultPosition, wxDefaultSize,
               wxDEFAULT_DIALOG_STYLE | wxRESIZE_BORDER, "PluginBox") {
  const int gap = FromDIP(10);
  list_ = new wxDataViewListCtrl(this, wxID_ANY, wxDefaultPosition, FromDIP(wxSize(940, 300)),
                                 wxDV_SINGLE | wxDV_ROW_LINES);
  list_->SetName(Label(kTitle));
  list_->AppendToggleColumn(Label("On"), wxDATAVIEW_CELL_ACTIVATABLE, FromDIP(50), wxALIGN_CENTER);
  struct Column {
    const char* title;
    int width;
  };
  for (const Column& column : {Column{TrLater("Extension"), 90},
                               {TrLater("Plug-in"), 140},
                               {TrLater("Formats"), 200},
                               {TrLater("Supports"), 150},
                               {TrLater("Version"), 60},
                               {TrLater("Libraries and licenses"), 260},
                               {TrLater("Module"), 150}}) {
    list_->AppendTextColumn(Label(column.title), wxDATAVIEW_CELL_INERT,
                            TextWidth(*this, column.width));
  }
  const std::string folder = platform::JoinFolder(platform::ProgramFolder(), "plugin");
  auto* place = new wxStaticText(this, wxID_ANY, Label("Plug-in folder: %1", Shown(folder)),
                                 wxDefaultPosition, wxDefaultSize, wxST_ELLIPSIZE_MIDDLE);
  note_ = new wxStaticText(this, wxID_ANY,
                           Label("Changes take effect at the next start of the program."));
  auto* buttons = new wxBoxSizer(wxHORIZONTAL);
  buttons->Add(new wxButton(this, wxID_PREFERENCES, Label("&Configure...")));
  buttons->Add(new wxButton(this, wxID_HELP, Label("&Help")), wxSizerFlags().Border(wxLEFT, gap));
  buttons->AddStretchSpacer();
  buttons->Add(new wxButton(this, wxID_CANCEL, Label("Close")));
  auto* column = new wxBoxSizer(wxVERTICAL);
  column->Add(list_, wxSizerFlags(1).Expand().Border(wxALL, gap));
  column->Add(place, wxSizerFlags().Expand().Border(wxLEFT | wxRIGHT, gap));
  column->Add(note_, wxSizerFlags().Expand().Border(wxLEFT | wxRIGHT | wxTOP, gap));
  column->Add(buttons, wxSizerFlags().Expand().Border(wxALL, gap));
  SetSizerAndFit(column);
  Bind(
      wxEVT_BUTTON, [this](wxCommandEvent&) { Configure(); }, wxID_PREFERENCES);
  Bind(
      wxEVT_BUTTON, [this](wxCommandEvent&) { OpenHelp(); }, wxID_HELP);
  list_->Bind(wxEVT_DATAVIEW_ITEM_VALUE_CHANGED,
              [this](wxDataViewEvent& event) { Turn(list_->ItemToRow(event.GetItem())); });
  list_->Bind(wxEVT_CHAR_HOOK, [this](wxKeyEvent& event) {
    const int line = list_->GetSelectedRow(), key = event.GetKeyCode();
    if (key == WXK_RETURN || key == WXK_NUMPAD_ENTER) return Configure();  // GTK would toggle
    if (key != WXK_SPACE || line == wxNOT_FOUND) return event.Skip();
    list_->SetToggleValue(!list_->GetToggleValue(static_cast<unsigned>(line), 0),
                          static_cast<unsigned>(line), 0);
    Turn(line);
  });
  list_->Bind(wxEVT_DATAVIEW_ITEM_ACTIVATED, [this](wxDataViewEvent&) { Configure(); });
  FillList();
  CentreOnParent();
  list_->SetFocus();
}

void PluginBox::FillList() {
  (void)PluginFormats();  // loads the modules
  for (const PluginModule& module : PluginModules()) AddModule(module);
  int selected = lines_.empty() ? wxNOT_FOUND : 0;
  for (size_t line = 0; line < lines_.size(); ++line) {
    if (lines_[line].row >= 0 && lines_[line].row == settings.PluginConfigIndex)
      selected = static_cast<int>(line);
  }
  if (selected != wxNOT_FOUND) {
    list_->SetCurrentItem(list_->RowToItem(selected));
    list_->EnsureVisible(list_->RowToItem(selected));
  }
  FindWindow(wxID_PREFERENCES)->Enable(PluginFormatCount() > 0);
  FindWindow(wxID_HELP)->Enable(PluginFormatCount() > 0);
  LogEvent("plugins", "lines=" + std::to_string(lines_.size()) +
                          " formats=" + std::to_string(PluginFormatCount()));
}

// One line per format of a module; one for a module that is not loaded.
void PluginBox::AddModule(const PluginModule& module) {
  const auto add = [&](int32_t row, std::string_view extension, std::string_view plugin,
                       std::string_view formats, std::string_view can, std::string_view version,
                       std::string_view libraries) {
    wxVector<wxVariant> cells;
    cells.push_back(module.on);
    for (const std::string_view cell :
         {extension, plugin, formats, can, version, libraries, std::string_view(module.name)})
      cells.push_back(Shown(cell));
    list_->AppendItem(cells);
    lines_.push_back({module.name, row});
  };
  bool loaded = false;
  for (int32_t row = 0; row < PluginFormatCount(); ++row) {
    const PluginEntry& entry = PluginRow(row);
    if (entry.path.view() != platform::JoinFolder(module.folder, module.name)) continue;
    std::string can = PluginFacts(row).writes ? Tr("read and write") : Tr("read");
    const ModuleFacts& facts = PluginFacts(row);
    if (facts.hasDialog || !facts.options.empty()) can.append(", ").append(Tr("settings"));
    add(row, entry.extension, entry.textA, entry.textB, can, facts.version,
        LibrariesText(facts.libraries));
    loaded = true;
  }
  if (!loaded) add(-1, {}, {}, {}, module.on ? Tr("not usable here") : Tr("disabled"), {}, {});
}

void PluginBox::Turn(int line) {
  if (line == wxNOT_FOUND) return;
  const std::string name = lines_[static_cast<size_t>(line)].module;
  const bool on = list_->GetToggleValue(static_cast<unsigned>(line), 0);
  for (unsigned other = 0; other < lines_.size(); ++other) {
    if (lines_[other].module == name && list_->GetToggleValue(other, 0) != on)
      list_->SetToggleValue(on, other, 0);
  }
  for (const PluginModule& module : PluginModules()) {
    if (module.name != name || module.on == on) continue;
    const std::string_view problem = SaveMessage(SwitchPluginModule(name, on));
    if (!problem.empty()) wxMessageBox(Shown(problem), Label(kTitle), wxOK | wxICON_WARNING, this);
    LogEvent("plugins", name + (on ? " on" : " off"));
  }
}

void PluginBox::Configure() {
  const int line = list_->GetSelectedRow();
  if (line == wxNOT_FOUND) return;
  const int32_t row = lines_[static_cast<size_t>(line)].row;
  if (row >= 0 && !PluginFacts(row).options.empty())
    return ChangeOptions(lines_[static_cast<size_t>(line)].module, row);
  if (row < 0 || !ConfigurePluginRow(row))
    wxMessageBox(Label(kNothingToConfigure.data()), Label(kTitle), wxOK | wxICON_INFORMATION, this);
}

void PluginBox::ChangeOptions(const std::string& module, int32_t row) {
  settings.PluginConfigIndex = row;
  const ModuleFacts& facts = PluginFacts(row);
  ModuleOptionsBox box(this, facts, OptionValuesOf(module, facts));
  if (box.ShowModal() != wxID_OK) return;
  const std::string_view problem =
      SaveMessage(StorePluginOptions(module, facts.options, box.Values()));
  if (!problem.empty()) wxMessageBox(Shown(problem), Label(kTitle), wxOK | wxICON_WARNING, this);
  LogEvent("plugins", module + " options");
}

void PluginBox::OpenHelp() {
  const int line = list_->GetSelectedRow();
  if (line == wxNOT_FOUND) return;
  const std::string page = PluginHelpPage(lines_[static_cast<size_t>(line)].row);
  const bool opened = platform::IsRegularFile(page) &&
                      platform::RunProgram(platform::ProgramFor(page), /*wait=*/false);
  LogEvent("plugins", "help " + page + (opened ? "" : ": none"));
  if (!opened)
    wxMessageBox(Label("This plug-in has no help page."), Label(kTitle), wxOK | wxICON_INFORMATION,
                 this);
}

}  // namespace fotomill::desktop
