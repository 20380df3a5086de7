#include "desktop/windows/dialogs/toolbar_box.h"

#include <wx/control.h>
#include <wx/msgdlg.h>
#include <wx/rearrangectrl.h>

#include <algorithm>

#include "desktop/models/shell/event_log.h"
#include "desktop/windows/shell/commands.h"
#include "desktop/windows/widgets/wx_text.h"
#include "texts/texts.h"

namespace fotomill::desktop {

namespace {

constexpr const char* kTitle = TrLater("Toolbar");

std::vector<ToolbarButton> KnownButtons() {
  std::vector<ToolbarButton> known;
  for (const Command& command : Commands()) {
    if (command.text != nullptr)
      known.push_back({ButtonNameOf(command), command.symbol != nullptr});
  }
  std::ranges::stable_partition(known, &ToolbarButton::shown);
  return known;
}

// "View: Details", as the same word occurs in several menus.
wxString LabelOf(const Command& command) {
  wxString label = wxControl::RemoveMnemonics(Label(command.menu)) + ": " +
                   wxControl::RemoveMnemonics(Label(command.text));
  label.EndsWith("...", &label);
  return label;
}

}  // namespace

std::vector<ToolbarButton> ToolbarButtons() { return LoadToolbar(KnownButtons()); }

bool AskForToolbar(wxWindow& parent) {
  const std::vector<ToolbarButton> before = ToolbarButtons();
  wxArrayInt order;
  wxArrayString labels;
  for (const ToolbarButton& button : before) {
    const int place = static_cast<int>(labels.size());
    order.push_back(button.shown ? place : ~place);  // how wxRearrangeList marks unchecked items
    labels.push_back(LabelOf(*CommandOfButton(button.name)));
  }
  wxRearrangeDialog dialog(&parent, Label("Toolbar buttons and their order:"), Label(kTitle), order,
                           labels);
  dialog.GetList()->SetName(Label("Buttons"));
  dialog.GetList()->SetSelection(0);
  dialog.GetList()->SetFocus();
  // Space toggles the selected line; by itself, the list only does so after an arrow key.
  dialog.Bind(wxEVT_CHAR_HOOK, [list = dialog.GetList()](wxKeyEvent& event) {
    const int line = list->GetSelection();
    if (event.GetKeyCode() != WXK_SPACE || !list->HasFocus() || line == wxNOT_FOUND)
      return event.Skip();
    list->Check(static_cast<unsigned>(line), !list->IsChecked(static_cast<unsigned>(line)));
  });
  LogEvent("prompt", "toolbar");
  if (dialog.ShowModal() != wxID_OK) return false;
  std::vector<ToolbarButton> buttons;
  for (const int place : dialog.GetOrder()) {
    buttons.push_back({before[static_cast<size_t>(place < 0 ? ~place : place)].name, place >= 0});
  }
  if (SaveToolbar(buttons)) return true;
  wxMessageBox(Label("The toolbar could not be saved in the data folder."), Label(kTitle),
               wxOK | wxICON_WARNING, &parent);
  return false;
}

}  // namespace fotomill::desktop
