#pragma once

#include "desktop/windows/widgets/key_commands.h"

namespace fotomill::desktop {

class ViewFrame;

// What a view window can do.
std::span<const KeyCommand<ViewFrame>> ViewCommands();

}  // namespace fotomill::desktop
