#pragma once

#include <span>
#include <string_view>

#include "cli/frame/command.h"

namespace fotomill::cli {

// All commands, in the order of the help page.
std::span<const Command> Commands();

// Finds a command by name, one word or two; null if not found.
const Command* FindCommand(std::string_view name);

}  // namespace fotomill::cli
