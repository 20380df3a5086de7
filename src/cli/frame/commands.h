#pragma once

#include <span>
#include <string_view>

#include "cli/frame/command.h"

namespace fotomill::cli {

// All commands in the order of the help page.
std::span<const Command> Commands();

// The command of that name, one word or two; null if there is none.
const Command* FindCommand(std::string_view name);

}  // namespace fotomill::cli
