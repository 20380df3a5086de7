#include "desktop/windows/shell/tool_windows.h"

#include "desktop/models/setup/setup_help.h"
#include "desktop/models/shell/event_log.h"
#include "desktop/windows/dialogs/help.h"
#include "desktop/windows/dialogs/plugin_box.h"
#include "desktop/windows/dialogs/upkeep_boxes.h"
#include "desktop/windows/history/history_box.h"
#include "desktop/windows/info/exif_frame.h"
#include "desktop/windows/info/info_frame.h"
#include "desktop/windows/setup/setup_box.h"
#include "desktop/windows/shell/main_frame.h"
#include "settings/setup_dialog.h"

namespace fotomill::desktop {

void ShowSetup(MainFrame& frame) {
  SetupBox(&frame, [&frame] { frame.SettingsChanged(); }).ShowModal();
  LogEvent("setup", "closed");
}

void ShowInfo(MainFrame& frame) {
  std::vector<std::string> files = frame.SelectedFiles();
  if (!files.empty()) (new InfoFrame(frame, &frame, std::move(files)))->Show();
}

void ShowExif(MainFrame& frame) {
  const std::vector<std::string> files = frame.SelectedFiles();
  if (!files.empty()) (new ExifFrame(&frame, files.front()))->Show();
}

void ShowFileHistory(MainFrame& frame) {
  FileHistoryBox(frame).ShowModal();
  LogEvent("history", "closed");
}
void ShowCompaction(MainFrame& frame) { CompactionBox(&frame, frame.CurrentFolder()).ShowModal(); }
void ShowCleanUp(MainFrame& frame) {
  CleanUpBox(&frame, frame.CurrentFolder()).ShowModal();
  LogEvent("cleanup", "closed");
}
void ShowPlugins(MainFrame& frame) { PluginBox(&frame).ShowModal(); }
void ShowManual(MainFrame& frame) { ShowHelp(frame, kManual); }
void ShowConfigurationHelp(MainFrame& frame) { ShowHelp(frame, kGeneralHelpPage); }

}  // namespace fotomill::desktop
