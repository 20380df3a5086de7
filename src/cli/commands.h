#pragma once

#include <span>

#include "cli/command.h"

namespace fotomill::cli {

// All commands in the order of the help page.
std::span<const Command> Commands();

}  // namespace fotomill::cli
