#include "desktop/windows/edit/operation_menu.h"

#include <wx/menu.h>

#include <string_view>

#include "desktop/models/edit/operation_memory.h"
#include "desktop/models/shell/event_log.h"
#include "desktop/windows/edit/crop_frame.h"
#include "desktop/windows/edit/edit_frame.h"
#include "desktop/windows/widgets/wx_text.h"
#include "operations/operations.h"
#include "settings/settings.h"

namespace fotomill::desktop {

void ChooseOperation(Shell& shell, wxWindow& owner, Family family) {
  OperationMemory memory;
  const Operation* const usual = &memory.Chosen(family);
  constexpr int kFirst = wxID_HIGHEST + 1;
  wxMenu menu;
  int id = kFirst;
  for (const Operation* operation : Operations()) {
    if (operation->family == family)
      menu.AppendRadioItem(id, Label(operation->label), Label(operation->help))
          ->Check(operation == usual);
    ++id;
  }
  LogEvent("operation-menu", std::string(FamilyName(family)) + " " + usual->name);
  const int chosen = owner.GetPopupMenuSelectionFromUser(menu);
  if (chosen == wxID_NONE) return;
  const Operation& operation = *Operations()[static_cast<size_t>(chosen - kFirst)];
  if (settings.RightClickOneTimeFunctions == 0) (void)memory.KeepChosen(operation);
  // Crop has a window of its own.
  if (std::string_view(operation.name) == "crop") return CropSelection(shell);
  EditSelectionWith(shell, operation);
}

}  // namespace fotomill::desktop
