#pragma once

#include <string>
#include <vector>

#include "core/workers/stop_token.h"
#include "platform/programs.h"

class wxMenu;

namespace fotomill::desktop {

class Shell;

// Other programs, started on files: they run beside this one. When one ends, the folders are read
// again and the window comes to the front, unless the program only handed over to another.
class ExternalPrograms {
 public:
  explicit ExternalPrograms(Shell& shell) : shell_(shell) {}
  ExternalPrograms(const ExternalPrograms&) = delete;
  ExternalPrograms& operator=(const ExternalPrograms&) = delete;
  ~ExternalPrograms() { stop_.Stop(); }

  // With the program registered for the file; a message if there is none.
  void Open(const std::string& file);
  // With a chosen one, at least one file.
  void OpenWith(const platform::Program& program, const std::vector<std::string>& files);

 private:
  void Start(const std::string& file, std::vector<std::string> command);

  Shell& shell_;
  const StopSource stop_;
};

// A new menu of the programs registered for files like the first of these; each opens all of them.
// Null if there are none.
wxMenu* NewOpenWithMenu(Shell& shell, const std::vector<std::string>& files);

}  // namespace fotomill::desktop
