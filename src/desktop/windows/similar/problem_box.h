#pragma once

#include <wx/window.h>

#include <string>
#include <vector>

namespace fotomill::desktop {

// Shows the files and folders that a search could not read, a line for each; modal.
void ShowProblemBox(wxWindow& parent, const std::vector<std::string>& problems);

}  // namespace fotomill::desktop
