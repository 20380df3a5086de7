#include "desktop/windows/edit/quick_menu.h"

#include <wx/event.h>
#include <wx/frame.h>
#include <wx/menu.h>
#include <wx/msgdlg.h>

#include <utility>

#include "desktop/models/edit/quick_actions.h"
#include "desktop/models/shell/event_log.h"
#include "desktop/windows/edit/apply_steps.h"
#include "desktop/windows/widgets/wx_text.h"

namespace fotomill::desktop {

namespace {

constexpr int kMostActions = 9;  // one for each digit key

wxString MenuText(const QuickAction& action, int place) {
  return Shown(action.text) + wxString::Format("\tCtrl+Alt+%d", place + 1);
}

// Sizes may have changed in Setup.
void UpdateTexts(wxMenuBar& bar) {
  int place = 0;
  for (const QuickAction& action : QuickActions()) {
    const wxString text = MenuText(action, place);
    wxMenuItem* const item = bar.FindItem(kFirstQuickId + place++);
    if (item != nullptr && item->GetItemLabel() != text) item->SetItemLabel(text);
  }
}

void Run(wxFrame& frame, Shell& shell, size_t place, const std::vector<std::string>& files) {
  const std::string recipe = QuickRecipe(place);
  if (recipe.empty()) {
    wxMessageBox(Label("No size is set. Enter one as WIDTH,HEIGHT in Setup."), Label("Resize"),
                 wxOK | wxICON_INFORMATION, &frame);
    return;
  }
  LogEvent("quick-action", recipe);
  (void)ChangeFilesBy(shell, files, recipe);
}

}  // namespace

wxMenu* NewQuickMenu() {
  auto* menu = new wxMenu;
  int place = 0;
  for (const QuickAction& action : QuickActions()) {
    if (place > 0 && action.startsGroup) menu->AppendSeparator();
    menu->Append(kFirstQuickId + place, MenuText(action, place));
    ++place;
  }
  return menu;
}

void HandleQuickActions(wxFrame& frame, Shell& shell, std::function<bool()> can,
                        std::function<std::vector<std::string>()> files) {
  constexpr int kLast = kFirstQuickId + kMostActions - 1;
  frame.Bind(
      wxEVT_MENU,
      [&frame, &shell, can, files = std::move(files)](wxCommandEvent& event) {
        if (can()) Run(frame, shell, static_cast<size_t>(event.GetId() - kFirstQuickId), files());
      },
      kFirstQuickId, kLast);
  frame.Bind(
      wxEVT_UPDATE_UI, [can](wxUpdateUIEvent& event) { event.Enable(can()); }, kFirstQuickId,
      kLast);
  frame.Bind(wxEVT_MENU_OPEN, [&frame](wxMenuEvent& event) {
    if (wxMenuBar* bar = frame.GetMenuBar()) UpdateTexts(*bar);
    event.Skip();
  });
}

}  // namespace fotomill::desktop
