#include "cli/commands.h"

#include "cli/match.h"

namespace fotomill::cli {

namespace {

// clang-format off
constexpr Command kCommands[] = {
    {"match",   "tell which format a file name selects, without opening it", SetUpMatch},
};
// clang-format on

}  // namespace

std::span<const Command> Commands() { return kCommands; }

}  // namespace fotomill::cli
