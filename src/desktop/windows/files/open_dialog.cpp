#include "desktop/windows/files/open_dialog.h"

#include <wx/filedlg.h>
#include <wx/frame.h>

#include <string>

#include "desktop/models/files/open_wildcard.h"
#include "desktop/models/shell/event_log.h"
#include "desktop/windows/shell/browser_tabs.h"
#include "desktop/windows/shell/shell.h"
#include "desktop/windows/widgets/wx_text.h"
#include "settings/settings.h"

namespace fotomill::desktop {

void AskAndOpenFile(Shell& shell) {
  const std::string last(settings.OpenPath.view());
  const std::string folder = last.empty() ? shell.Tabs().CurrentFolder() : last;
  wxFileDialog dialog(&shell.Window(), Label("Open picture"), wxString::FromUTF8(folder), "",
                      wxString::FromUTF8(OpenWildcard()), wxFD_OPEN | wxFD_FILE_MUST_EXIST);
  dialog.SetFilterIndex(FirstOpenFilter());
  LogEvent("prompt", "open");
  if (dialog.ShowModal() != wxID_OK) return;
  settings.OpenPath.AssignCut(Utf8(dialog.GetDirectory()));
  settings.OpenFilterIndex = dialog.GetFilterIndex();
  shell.OpenPath(Utf8(dialog.GetPath()));
}

}  // namespace fotomill::desktop
