#include "desktop/windows/shell/frame_menus.h"

#include <wx/frame.h>
#include <wx/menu.h>

#include <map>
#include <string>
#include <vector>

#include "desktop/windows/files/file_actions.h"
#include "desktop/windows/files/open_with.h"
#include "desktop/windows/shell/browser_tabs.h"
#include "desktop/windows/shell/commands.h"
#include "desktop/windows/shell/shell.h"
#include "desktop/windows/widgets/wx_text.h"

namespace fotomill::desktop {

namespace {

// With its key, as menus show it and take it.
wxString MenuText(const Command& command) {
  const wxString keys =
      *command.accelerator == '\0' ? wxString() : wxString("\t") + command.accelerator;
  return Label(command.text) + keys;
}

}  // namespace

FrameMenus::FrameMenus(Shell& shell) : shell_(shell) {
  BuildBar();
  BindSecondKeys();
  BindCommands();
}

void FrameMenus::BuildBar() {
  auto* bar = new wxMenuBar;
  std::map<std::string, wxMenu*> menus;
  for (const Command& command : Commands()) {
    wxMenu*& menu = menus[command.menu];
    if (menu == nullptr) bar->Append(menu = new wxMenu, Label(command.menu));
    if (command.text == nullptr) {
      menu->AppendSeparator();
      continue;
    }
    menu->Append(CommandId(command), MenuText(command), Label(command.help),
                 command.checked != nullptr ? wxITEM_CHECK : wxITEM_NORMAL);
  }
  shell_.Window().SetMenuBar(bar);
}

void FrameMenus::BindSecondKeys() {
  std::vector<wxAcceleratorEntry> keys;
  for (const Command& command : Commands()) {
    wxAcceleratorEntry key(0, 0, CommandId(command));
    if (command.secondKey != nullptr && key.FromString(wxString("\t") + command.secondKey))
      keys.push_back(key);
  }
  shell_.Window().SetAcceleratorTable(
      wxAcceleratorTable(static_cast<int>(keys.size()), keys.data()));
}

void FrameMenus::BindCommands() {
  const int last = kFirstCommandId + static_cast<int>(Commands().size()) - 1;
  shell_.Window().Bind(
      wxEVT_MENU,
      [this](wxCommandEvent& event) {
        const Command& command = CommandOfId(event.GetId());
        if (CanRun(command, shell_)) command.run(shell_);
      },
      kFirstCommandId, last);
  shell_.Window().Bind(
      wxEVT_UPDATE_UI, [this](wxUpdateUIEvent& event) { Update(event); }, kFirstCommandId, last);
}

void FrameMenus::Update(wxUpdateUIEvent& event) {
  const Command& command = CommandOfId(event.GetId());
  event.Enable(CanRun(command, shell_));
  if (command.checked != nullptr) event.Check(command.checked(shell_));
  if (command.needs != Needs::Undo && command.needs != Needs::Redo) return;
  const UndoList& undo = shell_.Files().Undoable();
  const std::string name = command.needs == Needs::Undo ? undo.UndoName() : undo.RedoName();
  const wxString verb = Label(command.text);
  const wxString text =
      (name.empty() ? verb : Label("%1 %2", verb, Shown(name))) + "\t" + command.accelerator;
  wxMenuBar* const bar = shell_.Window().GetMenuBar();
  if (event.GetEventObject() == bar || bar->FindItem(event.GetId())->GetItemLabel() != text) {
    bar->FindItem(event.GetId())->SetItemLabel(text);
  }
}

void FrameMenus::ShowContextMenu(wxWindow& window, const wxPoint& place) {
  wxMenu menu;
  for (const Command& command : Commands()) {
    if (command.text == nullptr || !command.inContextMenu) continue;
    menu.Append(CommandId(command), MenuText(command), Label(command.help));
  }
  if (wxMenu* programs = NewOpenWithMenu(shell_, shell_.Tabs().SelectedFiles())) {
    menu.AppendSeparator();
    menu.AppendSubMenu(programs, Label("Open &with"));
  }
  window.PopupMenu(&menu, place);
}

}  // namespace fotomill::desktop
