#include "desktop/windows/batch/notification.h"

#include <wx/filename.h>
#include <wx/log.h>
#include <wx/notifmsg.h>
#include <wx/utils.h>

#include <algorithm>

#include "desktop/models/shell/event_log.h"
#include "desktop/windows/widgets/wx_text.h"

namespace fotomill::desktop {

namespace {

// Whether the session has a message bus, without which notifications would start one.
bool HasPlaceForNotifications() {
  if (wxPlatformInfo::Get().GetPortId() != wxPORT_GTK) return true;
  wxString folder;
  return wxGetEnv("DBUS_SESSION_BUS_ADDRESS", nullptr) ||
         (wxGetEnv("XDG_RUNTIME_DIR", &folder) && wxFileName::Exists(folder + "/bus"));
}

}  // namespace

bool InFront() {
  const auto active = [](wxWindow* window) {
    return static_cast<wxTopLevelWindow*>(window)->IsActive();
  };
  return std::any_of(wxTopLevelWindows.begin(), wxTopLevelWindows.end(), active);
}

void NotifyUser(wxTopLevelWindow& window, const wxString& title, const wxString& text) {
  window.RequestUserAttention(wxUSER_ATTENTION_INFO);
  if (!HasPlaceForNotifications()) return;
  const wxLogNull quiet;  // notifications are optional
  wxNotificationMessage message(title, text, &window, wxICON_INFORMATION);
  LogEvent("notification", Utf8(title + ": " + text) + (message.Show() ? "" : " (not shown)"));
}

}  // namespace fotomill::desktop
