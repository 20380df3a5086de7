#include "cli/commands.h"

#include "cli/match.h"

namespace fotomill::cli {

namespace {

// clang-format off
constexpr Command kCommands[] = {
    {"match", "tell which format a file name selects, without opening it", Needs::Settings, SetUpMatch},
};
// clang-format on

}  // namespace

std::span<const Command> Commands() {
  return kCommands;
}

const Command* FindCommand(std::string_view name) {
  for (const Command& command : kCommands) {
    if (command.name == name) return &command;
  }
  return nullptr;
}

}  // namespace fotomill::cli
