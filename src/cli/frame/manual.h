#pragma once

#include <string>
#include <utility>
#include <vector>

namespace CLI {
class App;
}

namespace fotomill::cli {

struct CommandContext;

// Man pages of the program and of each command: file name ("fotomill-thumbs-make.1") and text with
// the macros of groff_man(7). Generated from the same tables as the help.
std::vector<std::pair<std::string, std::string>> ManualPages();

// Command "manual": sets context.run, which writes the man pages into a folder.
void SetUpManual(CLI::App& app, CommandContext& context);

}  // namespace fotomill::cli
