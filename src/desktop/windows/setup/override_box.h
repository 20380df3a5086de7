#pragma once

#include <wx/window.h>

#include <cstdint>
#include <string_view>

namespace fotomill::desktop {

// Whether a format, given by its extension, has options of its own, and the box that shows them:
// true when the user confirmed.
bool HasOverrideBox(std::string_view extension);
bool ShowOverrideBox(wxWindow* parent, std::string_view extension);
// Whether Shift at the destination step opens the box.
bool ShiftOpensOverrideBox();

// Makes the boxes known to the rows of the registry.
void InstallOverrideBoxes();

}  // namespace fotomill::desktop
