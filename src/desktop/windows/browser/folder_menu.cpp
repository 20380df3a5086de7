#include "desktop/windows/browser/folder_menu.h"

#include <wx/control.h>
#include <wx/menu.h>

#include <algorithm>

#include "desktop/models/shell/event_log.h"
#include "desktop/windows/widgets/wx_text.h"

namespace fotomill::desktop {

namespace {

constexpr size_t kMostFolders = 300;  // longer menus are useless
constexpr int kFirstId = wxID_HIGHEST + 1;

}  // namespace

std::optional<size_t> ChooseFolderFromMenu(wxWindow& window, const std::vector<Crumb>& folders,
                                           const std::string& current) {
  wxMenu menu;
  for (size_t i = 0; i < std::min(folders.size(), kMostFolders); ++i) {
    const wxString label = wxControl::EscapeMnemonics(Shown(folders[i].label));
    const bool marked = folders[i].folder == current;
    wxMenuItem* item = menu.Append(kFirstId + static_cast<int>(i), label, "",
                                   marked ? wxITEM_CHECK : wxITEM_NORMAL);
    if (marked) item->Check();
  }
  if (folders.empty()) menu.Append(wxID_NONE, Label("No folders"))->Enable(false);
  if (folders.size() > kMostFolders) {
    menu.Append(wxID_NONE, LabelCount("and %1 more", "and %1 more", folders.size() - kMostFolders))
        ->Enable(false);
  }
  LogEvent("folder-menu", std::to_string(folders.size()));
  const int chosen = window.GetPopupMenuSelectionFromUser(menu, 0, window.GetSize().y);
  if (chosen < kFirstId || chosen >= kFirstId + static_cast<int>(folders.size()))
    return std::nullopt;
  return static_cast<size_t>(chosen - kFirstId);
}

}  // namespace fotomill::desktop
