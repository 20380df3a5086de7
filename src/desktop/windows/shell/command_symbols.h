#pragma once

#include <string_view>

namespace fotomill::desktop {

struct Command;

// The symbol of a command's toolbar button, a general one if it has none of its own.
std::string_view SymbolOf(const Command& command);

}  // namespace fotomill::desktop
