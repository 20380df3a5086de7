#pragma once

#include <wx/button.h>

#include <functional>
#include <string>

#include "desktop/models/edit/operation_memory.h"

namespace fotomill::desktop {

// Opens the menu of the presets of an operation: its defaults, those of the user, and commands to
// save and remove them.
class PresetButton : public wxButton {
 public:
  // `memory` must outlive the button. `chosen` is called with the step of a preset.
  PresetButton(wxWindow* parent, OperationMemory& memory, std::function<void(Step step)> chosen);

  void SetStep(const Step* step);  // the current one; disables the button if it is null

 private:
  void ShowPresets();
  void SavePreset();

  OperationMemory& memory_;
  const std::function<void(Step step)> chosen_;
  Step step_;
};

}  // namespace fotomill::desktop
