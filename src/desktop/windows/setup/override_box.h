#pragma once

#include <wx/window.h>

#include <cstdint>
#include <string_view>

namespace fotomill::desktop {

// Whether a format, given by extension, has an options dialog; and shows that dialog: true if
// confirmed.
bool HasOverrideBox(std::string_view extension);
bool ShowOverrideBox(wxWindow* parent, std::string_view extension);
// Whether Shift opens the dialog in the destination step.
bool ShiftOpensOverrideBox();

// Registers the dialogs in the rows of the registry.
void InstallOverrideBoxes();

}  // namespace fotomill::desktop
