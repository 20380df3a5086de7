#pragma once

#include <string>
#include <string_view>

namespace fotomill::cli {

// The page of the whole program: usage, commands, global options, an example.
std::string MainHelp();

// The page of a topic, of one command, or of all commands whose first word it is ("tdb"). Empty if
// there is none.
std::string HelpOf(std::string_view name);

}  // namespace fotomill::cli
