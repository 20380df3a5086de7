#pragma once

#include <string>
#include <vector>

namespace fotomill::test {

// How a command line is run: what it reads, and whether it believes to be on a terminal.
struct Terminal {
  std::string input = {};
  bool interactive = false;  // standard input and standard error
  bool output = false;       // standard output
};

struct CommandResult {
  int status = -1;
  std::string out, err;

  // The standard error, in which each text is on a line of its own.
  bool Says(const std::string& line) const {
    return ("\n" + err).find("\n" + line + "\n") != std::string::npos;
  }
};

// Runs one command line in this process, with temporary files as its streams. `arguments` come
// without the program's name.
CommandResult RunCommand(const std::vector<std::string>& arguments, const Terminal& terminal = {});

}  // namespace fotomill::test
