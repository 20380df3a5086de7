#pragma once

namespace fotomill::desktop {

class MainFrame;

// The windows beside browser and view window, as commands of the frame.
void ShowSetup(MainFrame& frame);
void ShowInfo(MainFrame& frame);  // of the selected files
void ShowExif(MainFrame& frame);  // of the first selected file
void ShowFileHistory(MainFrame& frame);
void ShowCompaction(MainFrame& frame);
void ShowCleanUp(MainFrame& frame);  // of the folder in front
void ShowPlugins(MainFrame& frame);
void ShowManual(MainFrame& frame);
void ShowConfigurationHelp(MainFrame& frame);

}  // namespace fotomill::desktop
