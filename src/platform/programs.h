#pragma once

#include <string>
#include <vector>

namespace fotomill::platform {

// A program that is registered with the system for files of a type. Only the desktop program links
// these functions.
struct Program {
  std::string name;  // as menus show it, in the user's language
  std::string id;    // the system's own name for it

  bool operator==(const Program&) const = default;
};

// The programs registered for a file by its name, the user's own choice first; without those that
// need a terminal.
std::vector<Program> ProgramsFor(const std::string& file);
// Starts a program on files, given by absolute paths: once for all files when it takes several,
// else once each. False when it could not be started.
[[nodiscard]] bool OpenWith(const Program& program, const std::vector<std::string>& files);

}  // namespace fotomill::platform
