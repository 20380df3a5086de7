#pragma once

#include <string>
#include <string_view>

namespace fotomill::cli {

// The page of the whole program: usage, commands, global options, an example.
std::string MainHelp();

// The page of one command, or of all commands whose first word it is ("tdb"). Empty if there is
// none.
std::string HelpOf(std::string_view name);

// Name and version of the program, then of each library that is built in, one per line.
std::string VersionPage();

}  // namespace fotomill::cli
