#pragma once

class wxWindow;

namespace fotomill::desktop {

class BrowserModel;

// Asks for a pattern and selects, or takes out of the selection, the lines of a browser whose names
// match. True when the selection has changed.
bool AskAndSelect(wxWindow& parent, BrowserModel& model);

}  // namespace fotomill::desktop
