#pragma once

namespace fotomill::desktop {

class Shell;

// Shows the window for searching in folders; there is one at most. Its results are shown in a tab
// of the browser.
void ShowSearch(Shell& shell);

}  // namespace fotomill::desktop
