#include "desktop/windows/shell/frame_session.h"

#include <wx/frame.h>
#include <wx/msgdlg.h>

#include <algorithm>
#include <utility>

#include "desktop/models/shell/event_log.h"
#include "desktop/models/shell/tab_sets.h"
#include "desktop/windows/dialogs/tab_set_box.h"
#include "desktop/windows/shell/browser_tabs.h"
#include "desktop/windows/shell/shell.h"
#include "desktop/windows/widgets/wx_text.h"
#include "settings/configuration.h"
#include "settings/settings.h"
#include "texts/texts.h"

namespace fotomill::desktop {

namespace {

constexpr int kLeastWidth = 400, kLeastHeight = 200;  // device-independent pixels

}  // namespace

void FrameSession::RestorePlace() {
  const Session session = LoadSession();
  wxFrame& frame = shell_.Window();
  // Of the client area: the toolkit would show a window of another size first and shrink it by the
  // border that the window manager reports.
  const bool known = session.width > 0 && session.height > 0;
  frame.SetClientSize(known ? frame.FromDIP(wxSize(std::max(session.width, kLeastWidth),
                                                   std::max(session.height, kLeastHeight)))
                            : frame.GetClientSize());
  if (session.maximized) frame.Maximize();
  shell_.Tabs().SetColumns(session.columns);
  if (settings.RememberOpenWindows != 0) lastTabs_ = session;
}

bool FrameSession::RestoreTabs() {
  if (lastTabs_.tabs.empty()) return false;
  shell_.Tabs().Restore(std::exchange(lastTabs_, {}));
  return true;
}

bool FrameSession::Keep(bool withTabs) {
  const wxFrame& frame = shell_.Window();
  Session session;
  session.maximized = frame.IsMaximized();
  if (session.maximized) {  // keep the last unmaximized size
    const Session last = LoadSession();
    session.width = last.width;
    session.height = last.height;
  } else {
    const wxSize size = frame.ToDIP(frame.GetClientSize());
    session.width = size.x;
    session.height = size.y;
  }
  session.tab = lastTabs_.tab;
  shell_.Tabs().Keep(session);
  if (withTabs) {
    session.tabs.insert(session.tabs.end(), lastTabs_.tabs.begin(), lastTabs_.tabs.end());
  } else {
    session.tabs.clear();
  }
  return SaveSession(session);
}

// Saves the tabs as a named set, which is also updated on exit.
void FrameSession::SaveTabSet() {
  const auto name = AskForTabSetName(shell_.Window());
  if (!name) return;
  const SettingText before =
      std::exchange(settings.TabsetCurrentName, SettingText(TabSetFile(*name)));
  if (!Keep(true)) {
    settings.TabsetCurrentName = before;
    wxMessageBox(Label("The tab set could not be written."), "Fotomill Professional",
                 wxOK | wxICON_WARNING, &shell_.Window());
    return;
  }
  (void)SaveConfiguration();
  LogEvent("tab-set", "saved " + *name);
}

// Replaces the open tabs, which are saved in their own set.
void FrameSession::OpenTabSet() {
  const auto name = ChooseTabSet(shell_.Window());
  if (!name || *name == CurrentTabSet()) return;
  if (!Keep(true))
    return shell_.Report(Tr("The open tabs could not be saved, so they were left open."));
  const SettingText before =
      std::exchange(settings.TabsetCurrentName, SettingText(TabSetFile(*name)));
  const Session session = LoadSession();
  if (session.tabs.empty()) {
    settings.TabsetCurrentName = before;
    return shell_.Report(Tr("The folders of this tab set no longer exist."));
  }
  lastTabs_ = {};
  shell_.Tabs().Replace(session);
  (void)SaveConfiguration();
  LogEvent("tab-set", "opened " + *name);
}

}  // namespace fotomill::desktop
