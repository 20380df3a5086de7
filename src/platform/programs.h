#pragma once

#include <string>
#include <vector>

namespace fotomill::platform {

// A program that is registered for files of a type.
struct Program {
  std::string name;                // as menus show it
  std::vector<std::string> words;  // how it is started, in the system's own terms

  bool operator==(const Program&) const = default;
};

// The programs registered for a file by its name, the user's own choice first; without those that need a terminal.
std::vector<Program> ProgramsFor(const std::string& file);
// What opens files with a program: argument vectors for RunProgram. One for all files when it takes several, else one each.
std::vector<std::vector<std::string>> StartsOf(const Program& program, const std::vector<std::string>& files);

}  // namespace fotomill::platform
