#pragma once

#include "desktop/windows/widgets/key_commands.h"

namespace fotomill::desktop {

class ViewFrame;

// The menus of a view window: groups of commands between separators.
std::span<const MenuGroup> ViewMenus();
// The commands of a view window.
std::span<const KeyCommand<ViewFrame>> ViewCommands();

}  // namespace fotomill::desktop
