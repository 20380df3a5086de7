#pragma once

#include "operations/operation.h"

class wxWindow;

namespace fotomill::desktop {

class Shell;

// Lets the user choose an operation of a family for the selected files, in a menu at the pointer
// over `owner`. It becomes the family's operation, unless RightClickOneTimeFunctions is set.
void ChooseOperation(Shell& shell, wxWindow& owner, Family family);

}  // namespace fotomill::desktop
