#pragma once

#include <string>
#include <vector>

namespace fotomill::test {

// The environment of a command: its input, and whether it appears to be on a terminal.
struct Terminal {
  std::string input = {};
  bool interactive = false;  // standard input and standard error
  bool output = false;       // standard output
};

struct CommandResult {
  int status = -1;
  std::string out, err;

  // Whether standard error has this line.
  bool Says(const std::string& line) const {
    return ("\n" + err).find("\n" + line + "\n") != std::string::npos;
  }
};

// Runs a command in this process, with temporary files as its streams. `arguments` does not include
// the program's name.
CommandResult RunCommand(const std::vector<std::string>& arguments, const Terminal& terminal = {});

}  // namespace fotomill::test
