#pragma once

#include <string>
#include <vector>

namespace fotomill::platform {

// A program registered with the system for a file type. Only the desktop program
// links these functions.
struct Program {
  std::string name;  // for menus, in the user's language
  std::string id;    // the system's id for it

  bool operator==(const Program&) const = default;
};

// The programs registered for a file by its name, the user's default first; without those that need
// a terminal.
std::vector<Program> ProgramsFor(const std::string& file);
// The commands to open files, given by absolute paths, with a program, as argument vectors: one for
// all files if it accepts several, else one per file. Empty if the program no longer exists.
std::vector<std::vector<std::string>> CommandsFor(const Program& program,
                                                  const std::vector<std::string>& files);

}  // namespace fotomill::platform
