#include "desktop/windows/edit/preset_button.h"

#include <wx/menu.h>
#include <wx/msgdlg.h>
#include <wx/textdlg.h>

#include <utility>
#include <vector>

#include "desktop/models/edit/step_list.h"
#include "desktop/windows/widgets/wx_text.h"

namespace fotomill::desktop {

PresetButton::PresetButton(wxWindow* parent, OperationMemory& memory,
                           std::function<void(Step step)> chosen)
    : wxButton(parent, wxID_ANY, Label("&Presets")), memory_(memory), chosen_(std::move(chosen)) {
  Bind(wxEVT_BUTTON, [this](wxCommandEvent&) { ShowPresets(); });
}

void PresetButton::SetStep(const Step* step) {
  step_ = step == nullptr ? Step{} : *step;
  Enable(step != nullptr);
}

void PresetButton::ShowPresets() {
  const std::vector<Preset> presets = memory_.PresetsOf(*step_.operation);
  wxMenu menu;
  int id = wxID_HIGHEST + 1;
  const auto add = [&](wxMenu& to, const wxString& text, std::function<void()> run) {
    to.Append(++id, text);
    to.Bind(
        wxEVT_MENU, [run = std::move(run)](wxCommandEvent&) { run(); }, id);
  };
  add(menu, Label("&Defaults"), [this] { chosen_(FirstStep(*step_.operation)); });
  if (!presets.empty()) menu.AppendSeparator();
  for (const Preset& preset : presets)
    add(menu, wxControl::EscapeMnemonics(Shown(preset.name)),
        [this, step = preset.step] { chosen_(step); });
  menu.AppendSeparator();
  add(menu, Label("&Save as preset..."), [this] { SavePreset(); });
  if (!presets.empty()) {
    auto* removals = new wxMenu;
    for (const Preset& preset : presets)
      add(*removals, wxControl::EscapeMnemonics(Shown(preset.name)),
          [this, name = preset.name] { (void)memory_.RemovePreset(name, *step_.operation); });
    menu.AppendSubMenu(removals, Label("&Remove"));
  }
  PopupMenu(&menu, 0, GetSize().y);
}

void PresetButton::SavePreset() {
  wxWindow* const frame = wxGetTopLevelParent(this);
  wxTextEntryDialog dialog(frame, Label("Name of the preset:"), Label("Save preset"));
  if (dialog.ShowModal() != wxID_OK || dialog.GetValue().empty()) return;
  if (!memory_.KeepPreset(Utf8(dialog.GetValue()), step_))
    wxMessageBox(Label("The preset could not be saved."), Label("Save preset"),
                 wxOK | wxICON_WARNING, frame);
}

}  // namespace fotomill::desktop
