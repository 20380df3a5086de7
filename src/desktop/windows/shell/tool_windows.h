#pragma once

namespace fotomill::desktop {

class Shell;

// The windows beside browser and view window, as commands of the frame.
void ShowSetup(Shell& shell);
void ShowInfo(Shell& shell);  // of the selected files
void ShowExif(Shell& shell);  // of the first selected file
void ShowFileHistory(Shell& shell);  // modal
void ShowCompaction(Shell& shell);   // of a thumbnail database; modal
void ShowCleanUp(Shell& shell);  // of the folder in front
void ShowPlugins(Shell& shell);  // modal
void ShowManual(Shell& shell);   // in a window of its own help page
void ShowConfigurationHelp(Shell& shell);

}  // namespace fotomill::desktop
