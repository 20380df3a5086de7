#pragma once

class wxWindow;

namespace fotomill::desktop {

class BrowserModel;

// Asks for a pattern and selects or deselects the lines of a browser with matching names. True if
// the selection has changed.
bool AskAndSelect(wxWindow& parent, BrowserModel& model);

}  // namespace fotomill::desktop
