#include "desktop/windows/shell/function_toolbar.h"

#include <wx/frame.h>
#include <wx/toolbar.h>

#include <optional>
#include <string>

#include "desktop/models/shell/event_log.h"
#include "desktop/windows/dialogs/toolbar_box.h"
#include "desktop/windows/edit/operation_menu.h"
#include "desktop/windows/shell/command_symbols.h"
#include "desktop/windows/shell/commands.h"
#include "desktop/windows/shell/shell.h"
#include "desktop/windows/widgets/bitmaps.h"
#include "desktop/windows/widgets/wx_text.h"

namespace fotomill::desktop {

namespace {

// Buttons of families of operations have their names.
std::optional<Family> FamilyOf(const Command& command) {
  if (command.symbol == nullptr) return std::nullopt;
  for (const Family family : {Family::Crop, Family::Transform, Family::Effects, Family::Filter,
                              Family::Annotate, Family::Watermark, Family::Matt}) {
    if (command.symbol == FamilyName(family)) return family;
  }
  return std::nullopt;
}

}  // namespace

FunctionToolbar::FunctionToolbar(Shell& shell)
    : shell_(shell),
      bar_(shell.Window().CreateToolBar(wxTB_FLAT | wxTB_HORIZONTAL | wxTB_TEXT | wxTB_NODIVIDER,
                                        wxID_ANY, "Functions")) {
  Fill();
  // Updates tooltips; the frame handles enabling.
  bar_->Bind(wxEVT_UPDATE_UI, [this](wxUpdateUIEvent& event) {
    if (IsCommandId(event.GetId())) ShowTip(CommandOfId(event.GetId()));
    event.Skip();
  });
  bar_->Bind(wxEVT_TOOL_RCLICKED, [this](wxCommandEvent& event) {
    if (IsCommandId(event.GetId())) ChooseOfFamily(CommandOfId(event.GetId()));
  });
  // Symbols use the text color.
  shell_.Window().Bind(wxEVT_SYS_COLOUR_CHANGED, [this](wxSysColourChangedEvent& event) {
    Fill();
    LogEvent("colors", "changed");
    event.Skip();
  });
}

void FunctionToolbar::Fill() {
  bar_->ClearTools();
  std::string names;
  for (const ToolbarButton& button : ToolbarButtons()) {
    if (!button.shown) continue;
    const Command& command = *CommandOfButton(button.name);
    wxString label = wxControl::RemoveMnemonics(Label(command.text));
    label.EndsWith("...", &label);
    bar_->AddTool(CommandId(command), label, Symbol(SymbolOf(command), 20), Label(command.help),
                  command.checked == nullptr ? wxITEM_NORMAL : wxITEM_CHECK);
    names += " " + button.name;
  }
  bar_->Realize();
  LogEvent("toolbar", names.empty() ? names : names.substr(1));
}

void FunctionToolbar::Choose() {
  if (AskForToolbar(shell_.Window())) Fill();
}

void FunctionToolbar::ChooseOfFamily(const Command& command) {
  const std::optional<Family> family = FamilyOf(command);
  if (family && CanRun(command, shell_)) ChooseOperation(shell_, *bar_, *family);
}

// The tooltip of a disabled button says why.
void FunctionToolbar::ShowTip(const Command& command) {
  const std::string chosen = KeyOf(command);
  const wxString key = chosen.empty() ? wxString() : " (" + Shown(chosen) + ")";
  const wxString why =
      CanRun(command, shell_) ? wxString() : wxString("\n") + Label(WhyNot(command, shell_));
  const wxString more = FamilyOf(command) ? "\n" + Label("Right click: other operations") : "";
  const wxString tip = Label(command.help) + key + more + why;
  if (bar_->GetToolShortHelp(CommandId(command)) != tip)
    bar_->SetToolShortHelp(CommandId(command), tip);
}

}  // namespace fotomill::desktop
