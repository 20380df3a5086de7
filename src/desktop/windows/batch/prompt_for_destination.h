#pragma once

#include <string>

class wxWindow;

namespace fotomill::desktop {

// PromptForDestinationBox: asks whether to write files to a format, and whether to ask again
// (WarnDestinationWrite).
bool PromptForDestination(wxWindow& parent, const std::string& question);

}  // namespace fotomill::desktop
