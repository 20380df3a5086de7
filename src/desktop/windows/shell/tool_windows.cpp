#include "desktop/windows/shell/tool_windows.h"

#include "desktop/models/setup/setup_help.h"
#include "desktop/models/shell/event_log.h"
#include "desktop/windows/dialogs/about_box.h"
#include "desktop/windows/dialogs/help.h"
#include "desktop/windows/dialogs/plugin_box.h"
#include "desktop/windows/dialogs/upkeep_boxes.h"
#include "desktop/windows/history/history_box.h"
#include "desktop/windows/info/exif_frame.h"
#include "desktop/windows/info/info_frame.h"
#include "desktop/windows/setup/setup_box.h"
#include "desktop/windows/shell/browser_tabs.h"
#include "desktop/windows/shell/commands.h"
#include "desktop/windows/shell/shell.h"
#include "settings/setup_dialog.h"

namespace fotomill::desktop {

void ShowSetup(Shell& shell) {
  SetupBox(&shell.Window(), KeyedCommands(), [&shell] { shell.SettingsChanged(); }).ShowModal();
  LogEvent("setup", "closed");
}

void ShowInfo(Shell& shell) {
  std::vector<std::string> files = shell.Tabs().SelectedFiles();
  if (!files.empty()) (new InfoFrame(shell, &shell.Window(), std::move(files)))->Show();
}

void ShowExif(Shell& shell) {
  const std::vector<std::string> files = shell.Tabs().SelectedFiles();
  if (!files.empty()) (new ExifFrame(shell, &shell.Window(), files.front()))->Show();
}

void ShowFileHistory(Shell& shell) {
  FileHistoryBox(shell).ShowModal();
  LogEvent("history", "closed");
}
void ShowCompaction(Shell& shell) {
  CompactionBox(&shell.Window(), shell.Tabs().CurrentFolder()).ShowModal();
}
void ShowCleanUp(Shell& shell) {
  CleanUpBox(&shell.Window(), shell.Tabs().CurrentFolder()).ShowModal();
  LogEvent("cleanup", "closed");
}
void ShowPlugins(Shell& shell) { PluginBox(&shell.Window()).ShowModal(); }
void ShowManual(Shell& shell) { ShowHelp(shell.Window(), kManual); }
void ShowAbout(Shell& shell) { ShowAboutBox(shell.Window()); }
void ShowConfigurationHelp(Shell& shell) { ShowHelp(shell.Window(), kGeneralHelpPage); }

}  // namespace fotomill::desktop
