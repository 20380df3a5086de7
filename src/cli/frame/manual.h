#pragma once

#include <string>
#include <utility>
#include <vector>

namespace CLI {
class App;
}

namespace fotomill::cli {

struct CommandContext;

// The man pages of the program and of each command: file name ("fotomill-thumbs-make.1") and text
// in the man macros of groff_man(7). They are made from the tables behind the help.
std::vector<std::pair<std::string, std::string>> ManualPages();

// Command "manual": sets context.run, which writes the man pages into a folder.
void SetUpManual(CLI::App& app, CommandContext& context);

}  // namespace fotomill::cli
