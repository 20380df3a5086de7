#pragma once

#include <string>
#include <string_view>

namespace fotomill::cli {

// The main help page: usage, commands, global options, an example.
std::string MainHelp();

// The help page of a topic, a command, or all commands with this first word ("tdb"). Empty if not
// found.
std::string HelpOf(std::string_view name);

}  // namespace fotomill::cli
