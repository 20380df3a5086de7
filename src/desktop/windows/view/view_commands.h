#pragma once

#include "desktop/windows/widgets/key_commands.h"

namespace fotomill::desktop {

class ViewFrame;

// The commands of a view window.
std::span<const KeyCommand<ViewFrame>> ViewCommands();

}  // namespace fotomill::desktop
