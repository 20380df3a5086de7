#pragma once

#include <wx/defs.h>

#include <functional>
#include <string>
#include <vector>

class wxFrame;
class wxMenu;

namespace fotomill::desktop {

class Shell;

// A submenu with the quick actions, for a menu bar or a context menu of a frame that was passed to
// HandleQuickActions.
wxMenu* NewQuickMenu();

// Lets the quick actions of a frame's menus change the files that `files` returns, in place and
// without questions; can be undone. They are enabled while `can` is true.
void HandleQuickActions(wxFrame& frame, Shell& shell, std::function<bool()> can,
                        std::function<std::vector<std::string>()> files);

// The ID of an action, by its index in QuickActions.
inline constexpr int kFirstQuickId = wxID_HIGHEST + 5000;

}  // namespace fotomill::desktop
